#pragma once

#include <string>
#include <vector>

#include "config/CSVExtra.h"

// The steps both configuration readers share: opening the file, cutting the model's table
// and blocks, and reading their columns with errors that name the block, column and file.
class ConfigurationFile {
  public:
    // Loads path (throws cantOpenText + path when it cannot be read), sets the selection and
    // cuts the model table. Throws "Table not found: " + model + "in CSV." when the file has
    // no table for the model.
    ConfigurationFile(const std::string& path, const std::vector<std::string>& options,
                      const std::string& model, const std::string& cantOpenText);

    // The model's column key: the first cell's word holding the model, or the model one or
    // two characters shorter. Empty when none.
    static std::string ModelToken(const std::string& firstCell, const std::string& model);

    // Cuts a block of the model table and switches its header on; nullptr when absent.
    const CCSVTable* OptionalBlock(const std::string& name);
    // The same; a missing block is an error naming it.
    const CCSVTable& RequiredBlock(const std::string& name);
    // One text per block row of the column whose heading contains name.
    std::vector<std::string> Column(const CCSVTable& block, const std::string& name) const;
    // Whether the block has such a column.
    bool HasColumn(const CCSVTable& block, const std::string& name) const;
    // One text per block row of the column chosen by heading partials and installed options.
    std::vector<std::string> SelectedColumn(const CCSVTable& block,
                                            const std::vector<std::string>& partials);

    const CCSVTable& ModelTable() const { return *m_modelTable; }
    // Throws when the model is not listed in the file's first cell.
    const std::string& Token() const;
    const std::string& Path() const { return m_path; }

  private:
    CCSVExtra m_csv;
    std::string m_path;
    std::string m_model;
    std::string m_token;
    const CCSVTable* m_modelTable = nullptr;
};
