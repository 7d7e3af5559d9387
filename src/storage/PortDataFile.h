#pragma once

// The per-port data file in which a millimetre-wave system keeps a receiver's
// characterization, under the analyzer's configuration directory.

#include <optional>
#include <string>

namespace storage {

struct PortDataFile {
    char portDigit = '0';  // '1' to '4'
    std::string fileName;  // "RcvrCharRef.dat" or "RcvrCharTest.dat"
    std::string path;      // full Windows-style path
};

// A name with "R" in it is a reference receiver whose port digit is its second character;
// "A" to "D" are the test receivers of ports 1 to 4. Any other name has no port: nothing.
std::optional<PortDataFile> findPortDataFile(const std::string& model, const std::string& receiver);

// As findPortDataFile, but a name without a port raises an error text naming it.
PortDataFile portDataFile(const std::string& model, const std::string& receiver);

}  // namespace storage
