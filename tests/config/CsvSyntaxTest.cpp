#include <gtest/gtest.h>

#include <random>
#include <sstream>

#include "config/CSVContainer.h"
#include "config/CSVRow.h"

namespace {

// The cells of every row of text, read with skip-blank off.
std::vector<std::vector<std::string>> readRows(const std::string& text, bool skipBlank = false) {
    std::istringstream in(text);
    std::vector<std::vector<std::string>> rows;
    while (in.good()) {
        CCSVRow row;
        if (row.Read(in, skipBlank)) {
            std::vector<std::string> cells;
            for (std::size_t i = 0; i < row.CellCount(); ++i) {
                cells.push_back(row.GetText(i));
            }
            rows.push_back(cells);
        }
    }
    return rows;
}

using Rows = std::vector<std::vector<std::string>>;

TEST(CsvSyntax, CellsQuotesAndLineEnds) {
    struct Case {
        std::string text;
        Rows rows;
        bool skipBlank = false;
    };
    const Case cases[] = {
        // Quotes protect commas and line feeds; doubled quotes give one quote.
        {"a,\"b,c\",d\n", {{"a", "b,c", "d"}}},
        {"a,\"line one\nline two\",z\n", {{"a", "line one\nline two", "z"}}},
        {"\"say \"\"hi\"\"\"\n", {{"say \"hi\""}}},
        {"\"\",x\n", {{"", "x"}}},
        // Quotes in the middle of a cell only switch comma handling.
        {"ab\"c,d\"e,f\n", {{"abc,de", "f"}}},
        {"a,b,\n", {{"a", "b", ""}}},
        {"a\n\nb\n", {{"a"}, {""}, {"b"}}},
        {",,\n", {{"", "", ""}}},
        {"a\n\nb\n", {{"a"}, {"b"}}, true},
        {"a,b\r\nc\r\n", {{"a", "b"}, {"c"}}},
        {"a,b\nc", {{"a", "b"}, {"c"}}},
        {"a\n", {{"a"}}},
        // A carriage return not followed by a line feed is an ordinary character.
        {"a\rb\n", {{"a\rb"}}},
        {"\"x\r\ny\"\r\n", {{"x\ny"}}},
        {"", {}},
        {"  Mixed Case , x \n", {{"  Mixed Case ", " x "}}},  // text is kept exactly
    };
    for (const Case& c : cases) {
        EXPECT_EQ(readRows(c.text, c.skipBlank), c.rows) << c.text;
    }
}

std::string quoteCell(const std::string& text) {
    std::string out = "\"";
    for (char c : text) {
        out += c;
        if (c == '"') {
            out += '"';
        }
    }
    return out + "\"";
}

TEST(CsvSyntax, RandomGridsSurviveWriteAndRead) {
    std::mt19937 random(7);
    const std::string alphabet = "ab ,\"\n\r;x";
    for (int round = 0; round < 300; ++round) {
        Rows grid(1 + random() % 5);
        std::string text;
        for (auto& row : grid) {
            row.resize(1 + random() % 4);
            for (std::size_t c = 0; c < row.size(); ++c) {
                std::size_t length = random() % 6;
                for (std::size_t k = 0; k < length; ++k) {
                    row[c] += alphabet[random() % alphabet.size()];
                }
                text += (c ? "," : "") + quoteCell(row[c]);
                // A CR right before LF is not seen: compare against what a reader sees.
                std::string seen;
                for (std::size_t k = 0; k < row[c].size(); ++k) {
                    if (!(row[c][k] == '\r' && k + 1 < row[c].size() && row[c][k + 1] == '\n')) {
                        seen += row[c][k];
                    }
                }
                row[c] = seen;
            }
            text += "\n";
        }
        ASSERT_EQ(readRows(text), grid) << text;
    }
}

TEST(CsvContainerLoad, MissingFileLeavesContainerEmpty) {
    CCSVContainer csv;
    std::istringstream in("a\nb\n");
    ASSERT_TRUE(csv.Load(in, false));
    EXPECT_FALSE(csv.Load("/nonexistent/RcvrChar.dat", false));
    EXPECT_EQ(csv.RowCount(), 0U);
    EXPECT_EQ(csv.TotalRows(), 0U);
}

TEST(CsvContainerLoad, HeaderIsUpperCasedFirstRow) {
    CCSVContainer csv;
    std::istringstream in("Name,value,Ünï\nx,1\n");
    ASSERT_TRUE(csv.Load(in, false));
    ASSERT_EQ(csv.GetHeader().CellCount(), 3U);
    EXPECT_EQ(csv.GetHeader().GetText(0), "NAME");
    EXPECT_EQ(csv.GetHeader().GetText(2), "ÜNï");  // only a to z change
    EXPECT_EQ(csv.RowCount(), 1U);
    EXPECT_EQ(csv.GetCell(0, 1), "1");
    csv.SetHeaderFlag(false);
    EXPECT_EQ(csv.RowCount(), 2U);
    EXPECT_EQ(csv.GetCell(0, 0), "Name");
    EXPECT_EQ(csv.FindColumn("value"), -1);  // no columns by name without a header
}

}  // namespace
