#include <gtest/gtest.h>

#include <random>

#include "scpi/MessageFramer.h"

namespace {

using namespace std::literals;

// Feeds the pieces and collects every message handed out, an error as "!code".
std::vector<std::string> framed(scpi::MessageFramer& framer,
                                const std::vector<std::string_view>& pieces) {
    std::vector<std::string> out;
    for (auto piece : pieces) {
        framer.feed(piece);
        for (;;) {
            try {
                auto message = framer.next();
                if (!message) {
                    break;
                }
                out.push_back(std::move(*message));
            } catch (const scpi::Error& error) {
                out.push_back("!" + std::to_string(error.code));
            }
        }
    }
    return out;
}

TEST(ScpiFramer, FramesMessagesWhetherFedWholeOrByteByByte) {
    const std::tuple<std::size_t, std::vector<std::string_view>, std::vector<std::string>> cases[] =
        {
            {1000, {"*CLS\n*ESR?\n", "*IDN?\r\n\n"}, {"*CLS", "*ESR?", "*IDN?", ""}},
            // A CR that is block data stays; only the one before NL is terminator.
            {1000,
             {"D #13a\nb\n", "D #11\r\n", "D #11\r\r\n"},
             {"D #13a\nb", "D #11\r", "D #11\r"}},
            {1000, {"NAME \"a\nb';\"\n", "N 'x\"\r\n'\n"}, {"NAME \"a\nb';\"", "N 'x\"\r\n'"}},
            {1000,
             {"D #", "2", "1", "0abcd\nfghij;E\n", "X #HFF\n#\n"},
             {"D #210abcd\nfghij;E", "X #HFF", "#"}},
            // An error comes once in the message's place; input is dropped up to the next NL
            // outside a block, and the connection goes on.
            {1000, {"A\nD #0ab\nB\n", "D #2x\nC\n"}, {"A", "!-161", "B", "!-161", "C"}},
            {1000, {"D #9123456789 #13\n\n\n\nB\n"}, {"!-161", "B"}},
            {16,
             {"0123456789ABCDEF\n", "0123456789", "ABCDEFG", "H\nOK\n"},
             {"0123456789ABCDEF", "!-223", "OK"}},
            // A block too long for the message is refused from its header; its NLs are data.
            {16, {"D #220\n\n\n\n\n\n\n\n\n\n", "\n\n\n\n\n\n\n\n\n\n;X\nOK\n"}, {"!-223", "OK"}},
        };
    for (const auto& [limit, pieces, messages] : cases) {
        scpi::MessageFramer whole(limit);
        EXPECT_EQ(messages, framed(whole, pieces)) << pieces[0];
        std::vector<std::string_view> bytes;
        for (auto piece : pieces) {
            for (std::size_t i = 0; i < piece.size(); ++i) {
                bytes.push_back(piece.substr(i, 1));
            }
        }
        scpi::MessageFramer bytewise(limit);
        EXPECT_EQ(messages, framed(bytewise, bytes)) << pieces[0];
    }
}

TEST(ScpiFramer, HandsOutUnterminatedTextOnlyWhenItIsComplete) {
    scpi::MessageFramer framer;
    framer.feed("*RST\n*IDN?\r");
    EXPECT_FALSE(framer.pendingIsCompleteText());  // *RST comes first
    EXPECT_EQ("*RST", framer.next());
    EXPECT_EQ("*IDN?", framer.takePending());
    EXPECT_FALSE(framer.takePending());
    for (const char* open : {"NAME 'ab", "D #", "D #15ab", " \t\r"}) {
        scpi::MessageFramer f;
        f.feed(open);
        EXPECT_FALSE(f.pendingIsCompleteText()) << open;
    }
    // A block too long for the message is refused before its data arrives.
    scpi::MessageFramer small(16);
    EXPECT_EQ((std::vector<std::string>{"!-223"}), framed(small, {"D #220"}));
    // A device clear drops what was cut off, complete or not.
    framer.feed("*CLS\nD #15ab");
    framer.reset();
    EXPECT_EQ((std::vector<std::string>{"c", "*OPC?"}), framed(framer, {"c\n*OPC?\n"}));
}

TEST(ScpiFramer, ScansALargeStreamOnceAsItArrives) {
    // Rescanning from the start on each 4 KiB feed would take minutes here.
    std::string stream = "TRAC:DATA ";
    scpi::appendBlock(stream, std::string(8u << 20, '\n'));
    stream += "\n";
    std::size_t sent = 1;
    for (; stream.size() < (16u << 20); ++sent) {
        stream += "SENS:FREQ:STAR 1e9;'quoted\ntext';*OPC?\n";
    }
    scpi::MessageFramer framer;
    std::size_t messages = 0;
    std::size_t bytes = 0;
    for (std::size_t at = 0; at < stream.size(); at += 4096) {
        framer.feed(std::string_view(stream).substr(at, 4096));
        for (; auto message = framer.next(); ++messages) {
            bytes += message->size() + 1;
        }
    }
    EXPECT_EQ(sent, messages);
    EXPECT_EQ(stream.size(), bytes);
}

// Random messages of units with strings and blocks of any bytes, framed with NL or CR LF and
// cut into random pieces, come back whole, and so do their units and parameters.
TEST(ScpiFramer, RandomMessagesInRandomPiecesComeBackIdentical) {
    std::mt19937 random(7);
    auto pick = [&](std::size_t n) { return random() % n; };
    const std::string awkward = ";\"'#\n\r\0, 1aZ"s;
    struct Unit {
        std::string text;
        std::vector<std::pair<bool, std::string>> parameters;  // block?, bytes
    };
    std::vector<std::vector<Unit>> messages(400);
    std::string stream;
    for (auto& message : messages) {
        message.resize(1 + pick(4));
        for (auto& unit : message) {
            unit.text = pick(2) ? "TRAC:DATA" : "*OPC?";
            for (auto n = pick(4); n > 0; --n) {
                unit.text += unit.parameters.empty() ? " " : ",";
                std::string bytes(pick(8) ? pick(40) : pick(3000), '\0');
                for (char& b : bytes) {
                    b = pick(3) ? awkward[pick(awkward.size())] : static_cast<char>(pick(256));
                }
                bool block = pick(2);
                char quote = pick(2) ? '"' : '\'';
                if (block) {
                    scpi::appendBlock(unit.text, bytes);
                } else {
                    unit.text += quote;
                    for (char b : bytes) {
                        unit.text.append(b == quote ? 2 : 1, b);
                    }
                    unit.text += quote;
                }
                unit.parameters.emplace_back(block, bytes);
            }
            stream += (&unit == &message[0] ? "" : ";") + unit.text;
        }
        stream += pick(2) ? "\n" : "\r\n";
    }
    std::vector<std::string_view> pieces;
    for (std::size_t at = 0, size = 0; at < stream.size(); at += size) {
        size = pick(4) ? 1 + pick(16) : 1 + pick(8000);
        pieces.push_back(std::string_view(stream).substr(at, size));
    }
    scpi::MessageFramer framer;
    auto out = framed(framer, pieces);
    ASSERT_EQ(messages.size(), out.size());
    for (std::size_t m = 0; m < messages.size(); ++m) {
        auto units = scpi::splitMessageUnits(out[m]);
        ASSERT_EQ(messages[m].size(), units.size()) << m;
        for (std::size_t u = 0; u < units.size(); ++u) {
            ASSERT_EQ(messages[m][u].text, units[u]);
            scpi::ParameterReader reader(scpi::parseHeader(units[u]).parameters);
            for (const auto& [block, bytes] : messages[m][u].parameters) {
                EXPECT_EQ(bytes, block ? reader.block() : reader.string());
            }
            EXPECT_TRUE(reader.atEnd());
        }
    }
}

}  // namespace
