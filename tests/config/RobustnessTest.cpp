#include <gtest/gtest.h>

#include <algorithm>
#include <random>
#include <sstream>

#include "ConfigTestFiles.h"
#include "TempDir.h"
#include "config/T3872Acomcal.h"

namespace {

// Reads text as the dialog does. Only the two error kinds of the system may escape; any other
// exception (out of range, bad allocation) or a crash under the sanitizers is a fault.
bool readOrFailCleanly(const testsupport::TempDir& dir, const std::string& text,
                       const std::string& label) {
    auto path = dir / "RcvrChar.dat";
    testsupport::writeFile(path, text);
    CT3872Acomcal config;
    config.SetModel("T3872A");
    config.SetOptions({"010", "080"});
    try {
        config.ReadSequence(path.string());
        return true;
    } catch (const std::string& error) {
        EXPECT_FALSE(error.empty()) << label;
    } catch (const char* error) {
        EXPECT_NE(error, nullptr) << label;
    } catch (const std::exception& e) {
        ADD_FAILURE() << label << ": unexpected " << e.what();
    }
    return false;
}

class ReaderRobustness : public ::testing::Test {
  protected:
    std::string m_sample = testsupport::readFile(testsupport::sampleConfiguration());
    // Small enough to read hundreds of variants quickly under the sanitizers.
    std::string m_small = configtest::minimalConfiguration();
    testsupport::TempDir m_dir;
    std::mt19937 m_random{20240611};
};

TEST_F(ReaderRobustness, TruncatedFiles) {
    for (int i = 0; i < 15; ++i) {
        std::size_t cut = m_random() % m_sample.size();
        readOrFailCleanly(m_dir, m_sample.substr(0, cut), "sample cut at " + std::to_string(cut));
    }
    for (std::size_t cut = 0; cut < m_small.size(); cut += 7) {
        readOrFailCleanly(m_dir, m_small.substr(0, cut), "cut at " + std::to_string(cut));
    }
}

TEST_F(ReaderRobustness, ShuffledDroppedAndMutatedText) {
    std::istringstream in(m_small);
    std::vector<std::string> all;
    for (std::string line; std::getline(in, line);) {
        all.push_back(line + "\n");
    }
    int read = 0;
    for (int i = 0; i < 60; ++i) {
        auto shuffled = all;
        // Shuffle a window so that some structure survives and deeper code is reached.
        std::size_t from = m_random() % shuffled.size();
        std::size_t to = std::min(shuffled.size(), from + 2 + m_random() % 12);
        std::shuffle(shuffled.begin() + static_cast<std::ptrdiff_t>(from),
                     shuffled.begin() + static_cast<std::ptrdiff_t>(to), m_random);
        if (i % 2 == 0) {
            shuffled.erase(shuffled.begin() +
                           static_cast<std::ptrdiff_t>(m_random() % shuffled.size()));
        }
        std::string text;
        for (const auto& line : shuffled) {
            text += line;
        }
        read += readOrFailCleanly(m_dir, text, "shuffle " + std::to_string(i));
    }
    // Some variants must get through, or the deeper steps were never reached.
    EXPECT_GT(read, 0);
    read = 0;
    const std::string specials = ",\"\n\r &0x-9";
    for (int i = 0; i < 120; ++i) {
        std::string text = m_small;
        for (int k = 0; k < 1 + i % 8; ++k) {
            std::size_t at = m_random() % text.size();
            switch (m_random() % 3) {
                case 0:
                    text[at] = specials[m_random() % specials.size()];
                    break;
                case 1:
                    text.erase(at, 1 + m_random() % 10);
                    break;
                default:
                    text.insert(at, 1, static_cast<char>(m_random() % 256));
            }
        }
        read += readOrFailCleanly(m_dir, text, "mutation " + std::to_string(i));
    }
    EXPECT_GT(read, 0);
}

}  // namespace
