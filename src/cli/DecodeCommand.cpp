// `rcvrchar decode FILE`: prints a characterization data file in the export text layout.

#include <cerrno>
#include <cstring>
#include <fstream>
#include <iostream>
#include <iterator>

#include "cli/CommandRegistry.h"
#include "storage/ExportText.h"
#include "storage/RcvrCharImage.h"

namespace {

int decode(const std::string& file) {
    std::ifstream in(file, std::ios::binary);
    if (!in) {
        throw std::string("Cannot open " + file + ": " + std::strerror(errno));
    }
    std::string bytes((std::istreambuf_iterator<char>(in)), std::istreambuf_iterator<char>());
    if (bytes.size() % 2 != 0) {
        throw std::string(file + " is not a characterization data file: it holds an odd number " +
                          "of bytes (" + std::to_string(bytes.size()) + ")");
    }
    auto image = storage::RcvrCharImage::fromBytes(bytes);
    if (auto defect = image.defect(); !defect.empty()) {
        throw std::string(file + " is not a characterization data file: " + defect);
    }
    storage::writeExportText(std::cout, image);
    std::cout.flush();
    return 0;
}

const cli::CommandRegistration registration("decode", [](CLI::App& app) {
    app.description("Print a characterization data file in the export text layout");
    auto file = std::make_shared<std::string>();
    app.add_option("FILE", *file, "Data file such as RcvrCharRef.dat")->required();
    return [file] { return decode(*file); };
});

}  // namespace
