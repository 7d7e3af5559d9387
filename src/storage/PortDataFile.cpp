#include "storage/PortDataFile.h"

namespace storage {

std::optional<PortDataFile> findPortDataFile(const std::string& model,
                                             const std::string& receiver) {
    PortDataFile file;
    if (receiver.find('R') != std::string::npos) {
        file.fileName = "RcvrCharRef.dat";
        file.portDigit = receiver.size() > 1 ? receiver[1] : '\0';
    } else {
        file.fileName = "RcvrCharTest.dat";
        std::string::size_type index =
            receiver.size() == 1 ? std::string("ABCD").find(receiver) : std::string::npos;
        file.portDigit = index == std::string::npos ? '\0' : "1234"[index];
    }
    if (file.portDigit < '1' || file.portDigit > '4') {
        return std::nullopt;
    }
    file.path = "C:\\ProgramData\\Velquor\\Network Analyzer\\Configurations\\" + model +
                " Broadband\\Port " + file.portDigit + "\\Factory Cal Data\\" + file.fileName;
    return file;
}

PortDataFile portDataFile(const std::string& model, const std::string& receiver) {
    auto file = findPortDataFile(model, receiver);
    if (!file) {
        throw std::string("Receiver \"" + receiver + "\" has no port data file: it is neither " +
                          "a reference receiver R1 to R4 nor a test receiver A to D");
    }
    return *file;
}

}  // namespace storage
