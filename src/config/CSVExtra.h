#pragma once

#include <string>
#include <vector>

#include "config/CSVContainer.h"

// A CSV container that chooses among a block's columns by the analyzer's model and
// installed options. Column headings carry the rule: a plain heading always qualifies,
// "AOPT=x y !z" qualifies when x or y is installed and z is not, "OOPT=x y" only when the
// installed options are exactly x and y. The last qualifying heading wins.
class CCSVExtra : public CCSVContainer {
  public:
    ~CCSVExtra() override = default;

    // Must be called before any selection.
    void SetSelection(const std::vector<std::string>& optionCodes, const std::string& model);
    const std::vector<std::string>& GetOptions() const { return m_options; }
    const std::string& GetModel() const { return m_model; }

    // Column index, in the block's first row, of the heading that FindSelection chooses
    // among those containing every partial string. Throws the FindSelection text when none
    // qualifies.
    int SelectColumn(const std::string& blockName, const std::vector<std::string>& partials);
    // The chosen heading (byColumn) or row key among those containing every partial string;
    // empty when none qualifies, or throws that text when fail is set.
    std::string FindSelection(const CCSVTable& table, const std::vector<std::string>& partials,
                              bool byColumn, bool fail) const;
    // The last candidate that qualifies under the installed options; empty when none.
    std::string ChooseCandidate(const std::vector<std::string>& candidates) const;

  private:
    std::vector<std::string> m_options;
    std::string m_model;
};
