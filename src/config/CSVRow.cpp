#include "config/CSVRow.h"

#include <algorithm>

#include "config/TextMatch.h"

namespace {

const std::string kEmpty;

}  // namespace

bool CCSVRow::Read(std::istream& in, bool skipBlank) {
    std::string buffer;
    bool quoted = false;
    std::size_t count = 0;
    int previous = -1;
    std::streambuf* source = in.rdbuf();
    for (;;) {
        int c = source->sbumpc();
        if (c == std::char_traits<char>::eof()) {
            break;
        }
        // Text-mode reading: a CR directly before LF is not seen.
        if (c == '\r' && source->sgetc() == '\n') {
            continue;
        }
        if (c == '\n') {
            if (count == 0 && skipBlank) {
                return false;
            }
            if (!quoted) {
                AddOwnedCell(std::move(buffer));
                return true;
            }
            buffer.push_back('\n');
        } else if (c == '"') {
            if (!quoted && previous == '"') {
                buffer.push_back('"');
            }
            quoted = !quoted;
        } else if (c == ',' && !quoted) {
            AddOwnedCell(std::move(buffer));
            buffer.clear();
        } else {
            buffer.push_back(static_cast<char>(c));
        }
        previous = c;
        ++count;
    }
    in.setstate(std::ios::eofbit);
    if (count == 0) {
        return false;
    }
    AddOwnedCell(std::move(buffer));
    return true;
}

int CCSVRow::FindCell(const std::string& key, bool exact, int first, int last) const {
    if (m_cells.empty()) {
        return -1;
    }
    int end = static_cast<int>(m_cells.size()) - 1;
    int from = first < 0 ? 0 : first;
    int to = (last < 0 || last > end) ? end : last;
    for (int i = from; i <= to; ++i) {
        const std::string& text = m_cells[i]->GetText();
        bool hit = exact ? ToUpper(text) == key : ContainsNoCase(text, key);
        if (hit) {
            return i;
        }
    }
    return -1;
}

std::unique_ptr<CCSVRow> CCSVRow::SubRow(int first, int end) const {
    auto row = std::make_unique<CCSVRow>();
    int stop = std::min(end, static_cast<int>(m_cells.size()));
    for (int i = std::max(first, 0); i < stop; ++i) {
        row->AddViewCell(*m_cells[i]);
    }
    return row;
}

bool CCSVRow::IsEmpty(int first, int end) const {
    int count = static_cast<int>(m_cells.size());
    int from = first < 0 ? 0 : first;
    int stop = end < 0 ? count : std::min(end, count);
    for (int i = from; i < stop; ++i) {
        if (!m_cells[i]->GetText().empty()) {
            return false;
        }
    }
    return true;
}

void CCSVRow::Clear() {
    m_cells.clear();
    m_owned.clear();
}

const std::string& CCSVRow::TextOrEmpty(std::size_t index) const {
    return index < m_cells.size() ? m_cells[index]->GetText() : kEmpty;
}

void CCSVRow::AddOwnedCell(std::string text) {
    m_owned.emplace_back(std::move(text));
    m_cells.push_back(&m_owned.back());
}
