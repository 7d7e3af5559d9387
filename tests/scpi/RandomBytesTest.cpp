#include <gtest/gtest.h>

#include <random>

#include "scpi/MessageFramer.h"

namespace {

using namespace std::literals;

// Arbitrary bytes, rich in the ones the parsers care about, make every parser either
// succeed or throw scpi::Error: no crash, no hang, no other exception, nothing read out of
// bounds (the sanitizer build checks that).
TEST(ScpiRandomBytes, ParsersOnlyEverThrowScpiErrors) {
    std::mt19937 random(1234);
    const std::string alphabet = "#0123456789;,:?*\"' \t\r\n\0HQBeE+-.AbcdONF"s;
    std::size_t accepted = 0;
    std::size_t refused = 0;
    auto attempt = [&](auto&& parse) {
        try {
            parse();
            ++accepted;
        } catch (const scpi::Error&) {
            ++refused;
        }
    };
    for (int round = 0; round < 4000; ++round) {
        std::string bytes(random() % 120, '\0');
        for (char& b : bytes) {
            b = random() % 4 ? alphabet[random() % alphabet.size()] : static_cast<char>(random());
        }
        scpi::MessageFramer framer(64);
        std::size_t out = 0;
        for (std::size_t at = 0, size = 0; at < bytes.size(); at += size) {
            size = 1 + random() % 20;
            framer.feed(std::string_view(bytes).substr(at, size));
            for (bool more = true; more;) {
                attempt([&] {
                    auto message = framer.next();
                    more = message.has_value();
                    out += more ? message->size() + 1 : 0;
                });
            }
        }
        out += framer.takePending().value_or("").size();
        EXPECT_LE(out, bytes.size());

        for (std::string_view unit : scpi::splitMessageUnits(bytes)) {
            ASSERT_LE(static_cast<std::size_t>(unit.data() - bytes.data()) + unit.size(),
                      bytes.size());
            attempt([&] {
                scpi::ParameterReader reader(scpi::parseHeader(unit).parameters);
                // Every read takes at least one byte or throws.
                for (std::size_t reads = 0; !reader.atEnd(); ++reads) {
                    ASSERT_LE(reads, unit.size());
                    std::uint16_t word = 0;
                    switch (random() % 6) {
                        case 0:
                            reader.string();
                            break;
                        case 1:
                            reader.number();
                            break;
                        case 2:
                            reader.boolean();
                            break;
                        case 3:
                            reader.word();
                            break;
                        case 4:
                            reader.nextWord(word);
                            break;
                        default:
                            reader.block();
                    }
                }
            });
        }
        for (auto hash = bytes.find('#'); hash != std::string::npos;
             hash = bytes.find('#', hash + 1)) {
            attempt([&] {
                auto header = scpi::readBlockHeader(std::string_view(bytes).substr(hash));
                EXPECT_LE(header.value_or(scpi::BlockHeader{0, 0}).dataBytes, scpi::maxBlockBytes);
            });
        }
    }
    // Both the accepting and the refusing paths were reached.
    EXPECT_GT(accepted, 1000u);
    EXPECT_GT(refused, 1000u);
}

}  // namespace
