#include "config/CSVContainer.h"

#include <fstream>

#include "config/TextMatch.h"

CCSVContainer::~CCSVContainer() {
    Clear();
}

bool CCSVContainer::Load(const std::string& path, bool skipBlank) {
    Clear();
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        return false;
    }
    return Load(in, skipBlank);
}

bool CCSVContainer::Load(std::istream& in, bool skipBlank) {
    Clear();
    while (in.good()) {
        auto row = std::make_unique<CCSVRow>();
        if (row->Read(in, skipBlank)) {
            AppendRow(std::move(row));
        }
    }
    return GetHeaderFlag() ? MakeHeader() : true;
}

void CCSVContainer::Clear() {
    // Tables hold views of the rows' cells: they go first.
    m_tables.clear();
    ClearRows();
    ClearHeader();
}

CCSVTable* CCSVContainer::FindTable(const std::string& name) const {
    for (const auto& table : m_tables) {
        if (ContainsNoCase(table->GetName(), name)) {
            return table.get();
        }
    }
    return nullptr;
}

CCSVTable* CCSVContainer::CreateTable(const std::string& name, bool firstColumnOnly) {
    if (FindTable(name) != nullptr) {
        throw "Table already exists!: " + name;
    }
    int startColumn = -1;
    int startRow = -1;
    if (firstColumnOnly) {
        for (unsigned r = 0; r < RowCount(); ++r) {
            if (RowAt(RowIndex(r)).FindCell(name, false, 0, 1) == 0) {
                startColumn = 0;
                startRow = static_cast<int>(r);
            }
        }
    } else {
        std::tie(startColumn, startRow) = Find(name, false);
    }
    if (startRow < 0) {
        return nullptr;
    }
    const CCSVRow& start = RowAt(RowIndex(static_cast<std::size_t>(startRow)));
    int columnEnd = start.FindCell("", true);
    if (columnEnd < 0) {
        columnEnd = static_cast<int>(start.CellCount());
    }
    auto table = std::make_unique<CCSVTable>(ToUpper(start.GetText(startColumn)), startColumn,
                                             startRow, columnEnd);
    for (unsigned r = static_cast<unsigned>(startRow); r < RowCount(); ++r) {
        const CCSVRow& row = RowAt(RowIndex(r));
        if (row.IsEmpty(startColumn, columnEnd)) {
            break;
        }
        table->AddRow(row.SubRow(startColumn, columnEnd));
    }
    table->MakeHeader();
    table->SetHeaderFlag(true);
    m_tables.push_back(std::move(table));
    return m_tables.back().get();
}

CCSVTable* CCSVContainer::CreateSubTable(const std::string& parentName,
                                         const std::string& subName) {
    if (FindTable(subName) != nullptr) {
        throw "Table already exists!: " + subName;
    }
    const CCSVTable* parent = FindTable(parentName);
    if (parent == nullptr) {
        throw "Table not found: " + parentName + "in CSV.";
    }
    std::size_t first = 0;
    while (first < parent->TotalRows() &&
           !ContainsNoCase(parent->RowAt(first).TextOrEmpty(0), subName)) {
        ++first;
    }
    if (first == parent->TotalRows()) {
        return nullptr;
    }
    auto table = std::make_unique<CCSVTable>(ToUpper(subName), parent->GetFirstColumn(),
                                             parent->GetFirstRow() + static_cast<int>(first),
                                             parent->GetColumnEnd());
    for (std::size_t r = first; r < parent->TotalRows(); ++r) {
        const CCSVRow& row = parent->RowAt(r);
        if (r > first && !row.TextOrEmpty(0).empty()) {
            break;
        }
        table->AddRow(row.SubRow(0, static_cast<int>(row.CellCount())));
    }
    table->MakeHeader();
    table->SetHeaderFlag(false);
    m_tables.push_back(std::move(table));
    return m_tables.back().get();
}
