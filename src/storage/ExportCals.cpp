#include "storage/ExportCals.h"

#include <cerrno>
#include <cstring>
#include <fstream>

#include "storage/ExportText.h"
#include "storage/StoredImage.h"

namespace storage {

void exportCals(const StorageContext& context, const std::vector<std::string>& receivers,
                const CatalogFindings& findings) {
    platform::Answer answer = context.ui.messageBox(
        {"Would you like to export your current receiver characterization to text files?",
         "Export calibration?", platform::Buttons::YesNo,
         platform::BoxSystemModal | platform::BoxOwnedByDialog});
    if (answer == platform::Answer::Yes) {
        exportStoredCals(context, receivers, findings);
    }
}

ExportResult exportStoredCals(const StorageContext& context,
                              const std::vector<std::string>& receivers,
                              const CatalogFindings& findings) {
    ExportResult result;
    for (const auto& receiver : receivers) {
        auto state = findings.find(receiver);
        if (state == findings.end() || state->second == kCatalogNothing) {
            continue;
        }
        RcvrCharImage image = readStoredImage(context, receiver);
        if (image.completeness() == ImageCompleteness::NoHeader) {
            result.endedAt = receiver;
            result.reason = image.defect();
            break;
        }
        std::string name = "RcvrChar_" + flashName(receiver) + "_Exported.txt";
        auto local = context.paths.toLocal(name);
        std::ofstream out(local, std::ios::binary | std::ios::trunc);
        bool complete = out && writeExportText(out, image);
        out.close();
        if (!out) {
            throw std::string("Cannot write the export file " + name + " (" + local.string() +
                              "): " + std::strerror(errno));
        }
        result.files.push_back(name);
        if (!complete) {
            result.endedAt = receiver;
            result.reason = image.defect();
            break;
        }
    }
    return result;
}

}  // namespace storage
