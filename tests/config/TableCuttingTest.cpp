#include <gtest/gtest.h>

#include <sstream>

#include "ErrorOf.h"
#include "config/CSVContainer.h"

namespace {

using testsupport::errorOf;

// A container read from text with the header flag off, as the configuration readers use it.
class TableCutting : public ::testing::Test {
  protected:
    void load(const std::string& text) {
        std::istringstream in(text);
        ASSERT_TRUE(m_csv.Load(in, false));
        m_csv.SetHeaderFlag(false);
    }
    static std::vector<std::string> column(const CContainer& table, const std::string& name) {
        std::vector<std::string> values;
        EXPECT_TRUE(table.GetColumn(name, values)) << name;
        return values;
    }
    CCSVContainer m_csv;
};

const char* const kTwoModels =
    "T3872 T3877\n"
    "\n"
    "T3872A,Value,c2,c3\n"
    "minband,2\n"
    "Banded,BandNum,Start_freq\n"
    ",0,10\n"
    ",1,20\n"
    "Preset Powers,Calibration Names,T3872\n"
    ",R1,-10\n"
    "\n"
    "T3877A,Value,c2,c3\n"
    "maxband,5\n";

TEST_F(TableCutting, TableShapes) {
    struct Case {
        const char* text;
        const char* name;
        bool firstColumnOnly;
        int firstRow, firstColumn, columnEnd;  // -1: not checked
        std::size_t rows;
        int cellColumn;  // of data row 0
        const char* cell;
    };
    const Case cases[] = {
        // A model's table runs to its first empty row; the heading row is no data row.
        {kTwoModels, "t3872a", true, 2, 0, 4, 6, 0, "minband"},
        // Ends at the first row empty within its columns, whatever lies beyond.
        {"x,y\nTab,H1\n1,2\n,,beyond\n3,4\n", "Tab", false, -1, -1, -1, 1, 1, "2"},
        // Cells beyond the column end are cut.
        {"Tab,H1,,H3\n1,2,3,4\n", "Tab", true, -1, -1, 2, 1, 2, ""},
        // The first column only takes the lowest row naming the table.
        {"T3872A,old\nv,1\n\nnote,T3872A\n\nT3872A,new\nw,2\n", "T3872A", true, 5, -1, -1, 1, 0,
         "w"},
        // Any column: the search starts at the first hit.
        {"a,b\nz,Grid,H\n,1,2\n", "grid", false, -1, 1, 3, 1, 1, "2"},
        // Starting right of an empty cell gives no rows.
        {"a,,Grid,H\n,,1,2\n", "Grid", false, -1, -1, -1, 0, 0, ""},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.text);
        CCSVContainer csv;
        std::istringstream in(c.text);
        ASSERT_TRUE(csv.Load(in, false));
        csv.SetHeaderFlag(false);
        CCSVTable* table = csv.CreateTable(c.name, c.firstColumnOnly);
        ASSERT_NE(table, nullptr);
        for (auto [actual, expected] : {std::pair{table->GetFirstRow(), c.firstRow},
                                        {table->GetFirstColumn(), c.firstColumn},
                                        {table->GetColumnEnd(), c.columnEnd}}) {
            EXPECT_TRUE(expected < 0 || actual == expected) << actual << " for " << expected;
        }
        EXPECT_EQ(table->RowCount(), c.rows);
        if (c.rows == 0) {
            EXPECT_EQ(table->TotalRows(), 0U);  // not even a heading row
        }
        EXPECT_EQ(table->GetCell(0, c.cellColumn), c.cell);
    }
    // The heading row comes from the found cell on.
    load("a,b\nz,Grid,H\n,1,2\n");
    EXPECT_EQ(m_csv.CreateTable("grid", false)->GetHeader().GetText(1), "H");
}

TEST_F(TableCutting, MissingTableIsNoErrorDuplicateAndMissingParentAre) {
    load(kTwoModels);
    EXPECT_EQ(m_csv.CreateTable("T3999A", true), nullptr);
    EXPECT_EQ(m_csv.TableCount(), 0U);
    ASSERT_NE(m_csv.CreateTable("T3872A", true), nullptr);
    EXPECT_EQ(errorOf([&] { m_csv.CreateTable("T3872", true); }), "Table already exists!: T3872");
    ASSERT_NE(m_csv.CreateSubTable("T3872A", "Banded"), nullptr);
    EXPECT_EQ(errorOf([&] { m_csv.CreateSubTable("T3872A", "banded"); }),
              "Table already exists!: banded");
    EXPECT_EQ(errorOf([&] { m_csv.CreateSubTable("T3999A", "Preset Powers"); }),
              "Table not found: T3999Ain CSV.");
}

TEST_F(TableCutting, FindTableByContainmentOldestFirst) {
    load("Alpha Table,h\n1,2\n\nAlpha Two,h\n3,4\n");
    CCSVTable* first = m_csv.CreateTable("Alpha Table", true);
    CCSVTable* second = m_csv.CreateTable("Alpha Two", true);
    ASSERT_NE(first, nullptr);
    ASSERT_NE(second, nullptr);
    EXPECT_EQ(m_csv.FindTable("alpha"), first);
    EXPECT_EQ(m_csv.FindTable("TWO"), second);
    EXPECT_EQ(m_csv.FindTable("beta"), nullptr);
}

TEST_F(TableCutting, BlockRunsOverContinuationRows) {
    load(kTwoModels);
    m_csv.CreateTable("T3872A", true);
    CCSVTable* bands = m_csv.CreateSubTable("T3872A", "Banded");
    ASSERT_NE(bands, nullptr);
    EXPECT_EQ(bands->GetName(), "BANDED");
    // Header flag off: the naming row is data row 0.
    EXPECT_FALSE(bands->GetHeaderFlag());
    EXPECT_EQ(bands->RowCount(), 3U);
    EXPECT_EQ(bands->GetCell(0, 0), "Banded");
    bands->SetHeaderFlag(true);
    EXPECT_EQ(bands->RowCount(), 2U);
    EXPECT_EQ(column(*bands, "bandnum"), (std::vector<std::string>{"0", "1"}));
    EXPECT_EQ(column(*bands, "start_FREQ"), (std::vector<std::string>{"10", "20"}));
    EXPECT_EQ(m_csv.CreateSubTable("T3872A", "LFE Bands"), nullptr);
}

TEST_F(TableCutting, ShortRowsGiveEmptyValuesNotGaps) {
    load("T,H1,H2,H3\nx,1\ny,2,3,4\nz\n");
    CCSVTable* table = m_csv.CreateTable("T", true);
    ASSERT_NE(table, nullptr);
    EXPECT_EQ(column(*table, "H3"), (std::vector<std::string>{"", "4", ""}));
    std::vector<std::string> values{"kept"};
    EXPECT_TRUE(table->GetColumnValues(-1, values));
    EXPECT_EQ(values, (std::vector<std::string>{"kept", "", "", ""}));
    EXPECT_FALSE(table->GetColumn("H9", values));
}

TEST_F(TableCutting, CellAndRowAccessOutOfRange) {
    load("a,b\nc\n");
    EXPECT_EQ(m_csv.GetCell(1, 5), "");
    EXPECT_EQ(m_csv.GetCell(9, 0), "");
    CCSVRow row;
    EXPECT_TRUE(m_csv.GetRow(0, row));
    EXPECT_EQ(row.CellCount(), 2U);
    EXPECT_EQ(row.GetText(1), "b");
    EXPECT_FALSE(m_csv.GetRow(2, row));
}

TEST_F(TableCutting, FindScansRowsThenCells) {
    load("a,key1\nkey2,b\n");
    EXPECT_EQ(m_csv.Find("KEY", false), std::make_pair(1, 0));
    EXPECT_EQ(m_csv.Find("", true), std::make_pair(-1, -1));
    EXPECT_EQ(m_csv.Find("B", true), std::make_pair(1, 1));
    EXPECT_EQ(m_csv.Find("b", true), std::make_pair(-1, -1));  // exact keys are upper case
}

TEST(CsvRowSearch, FindCellRangesAndEmptiness) {
    std::istringstream in("One,two,,Three\n");
    CCSVRow row;
    ASSERT_TRUE(row.Read(in, false));
    EXPECT_EQ(row.FindCell("T", false), 1);
    EXPECT_EQ(row.FindCell("T", false, 2), 3);
    EXPECT_EQ(row.FindCell("THREE", false, -1, 2), -1);
    EXPECT_EQ(row.FindCell("THREE", false, 0, 99), 3);
    EXPECT_EQ(row.FindCell("", true), 2);
    EXPECT_TRUE(row.IsEmpty(2, 3));
    EXPECT_FALSE(row.IsEmpty(1, 3));
    EXPECT_TRUE(row.IsEmpty(3, 3));
    EXPECT_FALSE(row.IsEmpty());
    auto view = row.SubRow(1, 99);
    ASSERT_EQ(view->CellCount(), 3U);
    EXPECT_EQ(&view->GetCell(0), &row.GetCell(1));  // a view shares the cells
}

TEST_F(TableCutting, FindRowModes) {
    load("Red Apple,1\nGreen Apple,2\nRed Cherry,3\nRed Apple,4\n");
    std::vector<std::string> found;
    m_csv.findRow({"red", "APPLE"}, found, "all");
    EXPECT_EQ(found, (std::vector<std::string>{"Red Apple"}));
    found.clear();
    m_csv.findRow({"cherry", "green"}, found, "any");
    EXPECT_EQ(found, (std::vector<std::string>{"Red Cherry", "Green Apple"}));
    EXPECT_EQ(errorOf([&] { m_csv.findRow({}, found, "ALL"); }),
              "Partial string vector empty! (CContainer::findRow)");
}

TEST_F(TableCutting, FindColumnCollectsHeadingsOnlyWithHeader) {
    load("Block,T3872,T3872 AOPT=080,Other\n");
    std::vector<std::string> found;
    m_csv.findColumn({"t3872"}, found, "ALL");
    EXPECT_TRUE(found.empty());
    m_csv.SetHeaderFlag(true);
    m_csv.findColumn({"t3872"}, found, "ALL");
    EXPECT_EQ(found, (std::vector<std::string>{"T3872", "T3872 AOPT=080"}));
    EXPECT_EQ(m_csv.FindColumn("t3872", 2), 2);
}

}  // namespace
