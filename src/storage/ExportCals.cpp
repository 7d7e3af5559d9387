#include "storage/ExportCals.h"

#include <sstream>

#include "platform/WholeFile.h"
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
        std::ostringstream text;
        const bool complete = writeExportText(text, image);
        platform::writeWholeFile(context.paths.toLocal(name), text.str(),
                                 "the export file " + name);
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
