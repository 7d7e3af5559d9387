#include "storage/FlashTransfer.h"

#include <algorithm>
#include <chrono>

#include "storage/DataFile.h"
#include "storage/PortDataFile.h"

namespace storage {
namespace {

constexpr std::chrono::milliseconds kSettle{1000};

}  // namespace

void reportAnalyzerErrors(const StorageContext& context, const std::string& caption,
                          unsigned extraFlags) {
    std::string errors;
    if (context.analyzer.checkerrors(errors) != 0) {
        context.ui.messageBox(
            {errors, caption, platform::Buttons::Ok, platform::BoxSystemModal | extraFlags});
        context.log.append(errors);
    }
}

void pushPortFile(const StorageContext& context, const std::string& receiver,
                  const RcvrCharImage& image) {
    PortDataFile file = portDataFile(context.analyzer.readmodel(false), receiver);
    writeDataFile(context.paths, file.path, image.bytes());
    context.clock.wait(kSettle);
    std::string command = std::string("diag:mm:data:push ") + file.portDigit + ",0";
    context.log.append(command);
    context.analyzer.sendscpi(command);
    context.clock.wait(kSettle);
    reportAnalyzerErrors(context, "SCPI Error Writing Flash");
}

void writeFlashVerified(const StorageContext& context, const std::string& file,
                        const std::string& name, const RcvrCharImage& image) {
    context.analyzer.flasharray(file, name, image.words());
    const RcvrCharImage stored = RcvrCharImage::fromFlashReply(
        context.analyzer.sendscpi("DIAG:FLASHARRAY? \"" + file + "\",\"" + name + "\""));
    const auto& written = image.words();
    const auto& read = stored.words();
    if (read == written) {
        return;
    }
    const auto [w, r] = std::mismatch(written.begin(), written.end(), read.begin(), read.end());
    std::string where = w == written.end() || r == read.end()
                            ? std::to_string(read.size()) + " words read back, " +
                                  std::to_string(written.size()) + " written"
                            : "word " + std::to_string(w - written.begin()) + " reads " +
                                  std::to_string(*r) + ", " + std::to_string(*w) + " was written";
    throw std::string("The characterization of " + name + " did not read back from flash as " +
                      "written (" + where + "); it is not counted as stored.");
}

bool reloadFromFlash(const StorageContext& context, bool& needsPreparation) {
    // Set first: whatever the analyzer makes of the reload, it needs preparing again.
    needsPreparation = true;
    context.log.append("diag:fcal:load");
    context.analyzer.sendscpi("diag:fcal:load");
    reportAnalyzerErrors(context, "SCPI Error loading from flash");
    context.log.append("After diag fcal load  ");
    context.log.append("diag:mm:data:push 1,0");
    context.analyzer.sendscpi("diag:mm:data:push 1,0");
    context.clock.wait(kSettle);
    reportAnalyzerErrors(context, "SCPI Error Writing Flash");
    return true;
}

}  // namespace storage
