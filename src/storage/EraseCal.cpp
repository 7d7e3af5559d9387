#include "storage/EraseCal.h"

#include <chrono>

#include "storage/FlashTransfer.h"
#include "storage/PortDataFile.h"
#include "storage/StoredImage.h"

namespace storage {

void eraseCal(const StorageContext& context, platform::ProcessRunner& processes,
              const std::string& receiver, CatalogFindings& findings) {
    if (context.analyzer.ismmwave()) {
        PortDataFile file = portDataFile(context.analyzer.readmodel(false), receiver);
        processes.runCommand("del \"" + file.path + "\"");
        std::string command = std::string("diag:mm:data:push ") + file.portDigit + ",0";
        context.log.append("After deleting flash file  " + file.path);
        context.log.append(command);
        context.analyzer.sendscpi(command);
        context.clock.wait(std::chrono::milliseconds(1000));
        reportAnalyzerErrors(context, "SCPI Error Writing Flash", platform::BoxOwnedByDialog);
    } else {
        context.analyzer.sendscpi("DIAG:FLASH:file:erase \"RCVRCHAR\",\"" + flashName(receiver) +
                                  "\"");
    }
    findings[receiver] = kCatalogErased;
}

}  // namespace storage
