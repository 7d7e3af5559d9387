#include "config/Container.h"

#include <algorithm>

#include "config/TextMatch.h"

namespace {

// Appends text unless an equal text is already listed.
void AddUnique(std::vector<std::string>& list, const std::string& text) {
    if (std::find(list.begin(), list.end(), text) == list.end()) {
        list.push_back(text);
    }
}

// Collects the texts that contain a partial string (mode "ALL": every partial string).
void CollectMatches(const std::vector<const std::string*>& texts,
                    const std::vector<std::string>& partials, std::vector<std::string>& found,
                    const std::string& mode) {
    auto collect = [&](const std::string& partial) {
        for (const std::string* text : texts) {
            if (ContainsNoCase(*text, partial)) {
                AddUnique(found, *text);
            }
        }
    };
    if (ToUpper(mode) != "ALL") {
        for (const auto& partial : partials) {
            collect(partial);
        }
        return;
    }
    collect(partials.front());
    std::erase_if(found, [&](const std::string& entry) {
        return std::any_of(partials.begin() + 1, partials.end(),
                           [&](const std::string& p) { return !ContainsNoCase(entry, p); });
    });
}

}  // namespace

unsigned CContainer::RowCount() const {
    if (!m_headerFlag || m_rows.empty()) {
        return static_cast<unsigned>(m_rows.size());
    }
    return static_cast<unsigned>(m_rows.size() - 1);
}

bool CContainer::MakeHeader() {
    if (!m_headerFlag || m_rows.empty()) {
        return false;
    }
    m_header.Clear();
    const CCSVRow& first = *m_rows.front();
    for (std::size_t i = 0; i < first.CellCount(); ++i) {
        m_header.AddOwnedCell(ToUpper(first.GetText(i)));
    }
    return m_header.CellCount() > 0;
}

void CContainer::SetHeaderFlag(bool on) {
    if (on && !m_rows.empty() && (m_header.CellCount() == 0 || !m_headerFlag)) {
        m_headerFlag = true;
        MakeHeader();
    }
    m_headerFlag = on;
}

std::string CContainer::GetCell(std::size_t dataRow, std::size_t column) const {
    if (dataRow >= RowCount()) {
        return {};
    }
    return m_rows[RowIndex(dataRow)]->TextOrEmpty(column);
}

bool CContainer::GetRow(std::size_t dataRow, CCSVRow& row) const {
    if (dataRow >= RowCount()) {
        return false;
    }
    row.Clear();
    const CCSVRow& source = *m_rows[RowIndex(dataRow)];
    for (std::size_t i = 0; i < source.CellCount(); ++i) {
        row.AddViewCell(source.GetCell(i));
    }
    return true;
}

std::pair<int, int> CContainer::Find(const std::string& key, bool exact) const {
    for (unsigned r = 0; r < RowCount(); ++r) {
        int column = m_rows[RowIndex(r)]->FindCell(key, exact);
        if (column >= 0) {
            return {column, static_cast<int>(r)};
        }
    }
    return {-1, -1};
}

int CContainer::FindColumn(const std::string& name, int firstColumn) const {
    if (!m_headerFlag) {
        return -1;
    }
    for (int i = std::max(firstColumn, 0); i < static_cast<int>(m_header.CellCount()); ++i) {
        if (ContainsNoCase(m_header.GetText(i), name)) {
            return i;
        }
    }
    return -1;
}

bool CContainer::GetColumnValues(int column, std::vector<std::string>& values) const {
    for (unsigned r = 0; r < RowCount(); ++r) {
        values.push_back(column < 0
                             ? std::string()
                             : m_rows[RowIndex(r)]->TextOrEmpty(static_cast<std::size_t>(column)));
    }
    return true;
}

bool CContainer::GetColumn(const std::string& name, std::vector<std::string>& values) const {
    if (!m_headerFlag) {
        return false;
    }
    int column = FindColumn(name, 0);
    if (column < 0) {
        return false;
    }
    return GetColumnValues(column, values);
}

void CContainer::findRow(const std::vector<std::string>& partials, std::vector<std::string>& found,
                         const std::string& mode) const {
    if (partials.empty()) {
        throw std::string("Partial string vector empty! (CContainer::findRow)");
    }
    std::vector<const std::string*> texts;
    for (const auto& row : m_rows) {
        texts.push_back(&row->TextOrEmpty(0));
    }
    CollectMatches(texts, partials, found, mode);
}

void CContainer::findColumn(const std::vector<std::string>& partials,
                            std::vector<std::string>& found, const std::string& mode) const {
    if (partials.empty()) {
        throw std::string("Partial string vector empty! (CContainer::findColumn)");
    }
    if (!m_headerFlag) {
        return;
    }
    std::vector<const std::string*> texts;
    for (std::size_t i = 0; i < m_header.CellCount(); ++i) {
        texts.push_back(&m_header.GetText(i));
    }
    CollectMatches(texts, partials, found, mode);
}
