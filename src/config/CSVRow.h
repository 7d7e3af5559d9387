#pragma once

#include <deque>
#include <istream>
#include <memory>
#include <string>
#include <vector>

#include "config/Cell.h"

// The cells of one row, left to right. A row either owns its cells (rows read from a file,
// headers) or is a view whose cells are owned by another row that must outlive it.
class CCSVRow {
  public:
    CCSVRow() = default;
    virtual ~CCSVRow() = default;
    CCSVRow(const CCSVRow&) = delete;
    CCSVRow& operator=(const CCSVRow&) = delete;

    // Reads one row: commas separate cells, double quotes switch comma and line-feed
    // handling off and on, a doubled quote outside quoting yields one quote character.
    // CR LF reads as LF. False at end of input, or for an empty line when skipBlank is on.
    bool Read(std::istream& in, bool skipBlank);

    // Index of the first cell in [first, last] (inclusive; -1 means the row's start or end)
    // whose text contains the key, ignoring case; with exact on, whose upper-cased text
    // equals the key as given. -1 when none.
    int FindCell(const std::string& key, bool exact, int first = -1, int last = -1) const;

    // A new view of cells first .. min(end, CellCount()) - 1.
    std::unique_ptr<CCSVRow> SubRow(int first, int end) const;

    // True when every cell in [first, min(end, CellCount())) is empty; -1 means the row's
    // start or end. An empty range counts as empty.
    bool IsEmpty(int first = -1, int end = -1) const;

    // Deletes the owned cells and empties the row.
    void Clear();

    std::size_t CellCount() const { return m_cells.size(); }
    // Text of cell index; the cell must exist.
    const std::string& GetText(std::size_t index) const { return m_cells[index]->GetText(); }
    // Text of cell index, or an empty text when the row is shorter.
    const std::string& TextOrEmpty(std::size_t index) const;
    const CCell& GetCell(std::size_t index) const { return *m_cells[index]; }

    // Appends a cell that this row owns.
    void AddOwnedCell(std::string text);
    // Appends a handle to a cell owned elsewhere.
    void AddViewCell(const CCell& cell) { m_cells.push_back(&cell); }

  private:
    std::vector<const CCell*> m_cells;
    std::deque<CCell> m_owned;  // stable addresses for the views of other rows
};
