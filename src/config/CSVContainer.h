#pragma once

#include <istream>
#include <memory>
#include <string>
#include <vector>

#include "config/CSVTable.h"
#include "config/Container.h"

// A whole CSV file and the named tables cut from it. Table handles stay valid until the
// container is cleared or destroyed.
class CCSVContainer : public CContainer {
  public:
    CCSVContainer() = default;
    ~CCSVContainer() override;

    // Clears, then reads the file; false (and empty) when it cannot be opened, or when the
    // header flag is on and no header could be built.
    bool Load(const std::string& path, bool skipBlank);
    // The same from a stream already open.
    bool Load(std::istream& in, bool skipBlank);
    // Destroys the tables, then the rows and their cells, then empties the header.
    void Clear();

    // First table, in creation order, whose name contains the name; nullptr when none.
    CCSVTable* FindTable(const std::string& name) const;
    // Cuts a table that starts at the cell naming it (with firstColumnOnly, the lowest row
    // whose cell 0 contains the name). nullptr when no cell names it. Throws
    // "Table already exists!: " + name.
    CCSVTable* CreateTable(const std::string& name, bool firstColumnOnly);
    // Cuts the block of the parent table that starts at the first row whose cell 0 contains
    // subName and runs over the following rows whose cell 0 is empty. nullptr when no row
    // names it. Throws "Table already exists!: " + subName, or
    // "Table not found: " + parentName + "in CSV.". The block's header flag is off.
    CCSVTable* CreateSubTable(const std::string& parentName, const std::string& subName);

    std::size_t TableCount() const { return m_tables.size(); }

  private:
    std::vector<std::unique_ptr<CCSVTable>> m_tables;
};
