#include "config/ConfigurationFile.h"

ConfigurationFile::ConfigurationFile(const std::string& path,
                                     const std::vector<std::string>& options,
                                     const std::string& model, const std::string& cantOpenText)
    : m_path(path), m_model(model) {
    if (!m_csv.Load(path, false)) {
        throw cantOpenText + path;
    }
    m_csv.SetHeaderFlag(false);
    m_csv.SetSelection(options, model);
    m_modelTable = m_csv.CreateTable(model, true);
    if (m_modelTable == nullptr) {
        throw "Table not found: " + model + "in CSV.";
    }
    m_token = ModelToken(m_csv.GetCell(0, 0), model);
}

std::string ConfigurationFile::ModelToken(const std::string& firstCell, const std::string& model) {
    std::string key = model;
    for (int attempt = 0; attempt < 3 && !key.empty(); ++attempt) {
        std::size_t at = firstCell.find(key);
        if (at != std::string::npos) {
            std::string token = firstCell.substr(at);
            token = token.substr(0, token.find(' '));
            return token.substr(0, token.find(','));
        }
        key.pop_back();
    }
    return {};
}

const std::string& ConfigurationFile::Token() const {
    if (m_token.empty()) {
        throw "Model " + m_model + " is not listed in the first cell of " + m_path;
    }
    return m_token;
}

const CCSVTable* ConfigurationFile::OptionalBlock(const std::string& name) {
    CCSVTable* block = m_csv.CreateSubTable(m_model, name);
    if (block != nullptr) {
        block->SetHeaderFlag(true);
    }
    return block;
}

const CCSVTable& ConfigurationFile::RequiredBlock(const std::string& name) {
    const CCSVTable* block = OptionalBlock(name);
    if (block == nullptr) {
        throw "Block \"" + name + "\" is missing from the table of model " + m_model + " in " +
            m_path;
    }
    return *block;
}

bool ConfigurationFile::HasColumn(const CCSVTable& block, const std::string& name) const {
    return block.FindColumn(name, 0) >= 0;
}

std::vector<std::string> ConfigurationFile::Column(const CCSVTable& block,
                                                   const std::string& name) const {
    std::vector<std::string> values;
    if (!block.GetColumn(name, values)) {
        throw "Column \"" + name + "\" is missing from block \"" + block.GetName() +
            "\" of model " + m_model + " in " + m_path;
    }
    return values;
}

std::vector<std::string> ConfigurationFile::SelectedColumn(
    const CCSVTable& block, const std::vector<std::string>& partials) {
    std::vector<std::string> values;
    block.GetColumnValues(m_csv.SelectColumn(block.GetName(), partials), values);
    return values;
}
