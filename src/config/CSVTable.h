#pragma once

#include <string>

#include "config/Container.h"

// A table cut from a CCSVContainer: its rows are views of the container's cells, so the
// table must not outlive the container that cut it (the container owns it).
class CCSVTable : public CContainer {
  public:
    CCSVTable(std::string name, int firstColumn, int firstRow, int columnEnd)
        : m_firstColumn(firstColumn),
          m_firstRow(firstRow),
          m_columnEnd(columnEnd),
          m_rowEnd(firstRow),
          m_name(std::move(name)) {}
    ~CCSVTable() override = default;

    // Adds a view row and extends the row end by one.
    void AddRow(std::unique_ptr<CCSVRow> row) {
        AppendRow(std::move(row));
        ++m_rowEnd;
    }

    const std::string& GetName() const { return m_name; }
    int GetFirstColumn() const { return m_firstColumn; }
    int GetFirstRow() const { return m_firstRow; }
    int GetColumnEnd() const { return m_columnEnd; }
    int GetRowEnd() const { return m_rowEnd; }

  private:
    int m_firstColumn;
    int m_firstRow;
    int m_columnEnd;
    int m_rowEnd;
    std::string m_name;
};
