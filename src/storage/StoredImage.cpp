#include "storage/StoredImage.h"

#include "storage/DataFile.h"
#include "storage/PortDataFile.h"
#include "storage/ReceiverNames.h"

namespace storage {

std::string flashName(const std::string& receiver) {
    return shortReceiverName(receiver);
}

RcvrCharImage readStoredImage(const StorageContext& context, const std::string& receiver) {
    if (context.analyzer.ismmwave()) {
        auto file = findPortDataFile(context.analyzer.readmodel(false), receiver);
        if (!file) {
            return {};
        }
        auto bytes = readDataFile(context.paths, file->path);
        return bytes ? RcvrCharImage::fromBytes(*bytes) : RcvrCharImage{};
    }
    return RcvrCharImage::fromFlashReply(
        context.analyzer.sendscpi("DIAG:flasharray? \"RCVRCHAR\",\"" + flashName(receiver) + "\""));
}

}  // namespace storage
