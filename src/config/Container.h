#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "config/CSVRow.h"

// Rows top to bottom. When the header flag is on (the default), row 0 is the header and
// data row k is row k + 1; otherwise data row k is row k. All name matching is
// case-insensitive containment.
class CContainer {
  public:
    CContainer() = default;
    virtual ~CContainer() = default;
    CContainer(const CContainer&) = delete;
    CContainer& operator=(const CContainer&) = delete;

    // Number of data rows.
    unsigned RowCount() const;
    // Rebuilds the header from upper-cased copies of row 0; false when the flag is off or
    // there are no rows.
    bool MakeHeader();
    void SetHeaderFlag(bool on);
    bool GetHeaderFlag() const { return m_headerFlag; }
    const CCSVRow& GetHeader() const { return m_header; }

    // Copy of a cell's text; empty when the row or column does not exist.
    std::string GetCell(std::size_t dataRow, std::size_t column) const;
    // Fills row with views of the data row's cells; false when there is no such row.
    bool GetRow(std::size_t dataRow, CCSVRow& row) const;
    // First (column, data row) whose cell contains the key, rows top to bottom, cells left to
    // right; (-1, -1) when none.
    std::pair<int, int> Find(const std::string& key, bool exact) const;
    // First header cell at or after firstColumn that contains the name; -1 when none or
    // when the header flag is off.
    int FindColumn(const std::string& name, int firstColumn = 0) const;
    // Appends one text per data row (empty when the row is shorter); always true.
    bool GetColumnValues(int column, std::vector<std::string>& values) const;
    // GetColumnValues of FindColumn(name); false when the column is not found.
    bool GetColumn(const std::string& name, std::vector<std::string>& values) const;

    // Appends the texts of cell 0 of every row (header included) that contain a partial
    // string, skipping texts already listed. Mode "ALL" (any case) keeps only rows that
    // contain every partial string; any other mode keeps rows that contain at least one.
    void findRow(const std::vector<std::string>& partials, std::vector<std::string>& found,
                 const std::string& mode) const;
    // The same over the header cells; collects nothing while the header flag is off.
    void findColumn(const std::vector<std::string>& partials, std::vector<std::string>& found,
                    const std::string& mode) const;

    // All rows, header row included.
    std::size_t TotalRows() const { return m_rows.size(); }
    const CCSVRow& RowAt(std::size_t index) const { return *m_rows[index]; }

  protected:
    void AppendRow(std::unique_ptr<CCSVRow> row) { m_rows.push_back(std::move(row)); }
    void ClearRows() { m_rows.clear(); }
    void ClearHeader() { m_header.Clear(); }
    // Index into m_rows of a data row.
    std::size_t RowIndex(std::size_t dataRow) const { return m_headerFlag ? dataRow + 1 : dataRow; }

  private:
    std::vector<std::unique_ptr<CCSVRow>> m_rows;
    bool m_headerFlag = true;
    CCSVRow m_header;
};
