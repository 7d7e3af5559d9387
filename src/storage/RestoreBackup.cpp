#include "storage/RestoreBackup.h"

#include <chrono>
#include <fstream>
#include <sstream>

#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/Sha256.h"
#include "storage/FlashTransfer.h"
#include "storage/StoredBackups.h"
#include "storage/StoredImage.h"

namespace storage {

void restoreEntry(const StorageContext& context, const std::filesystem::path& folder,
                  const BackupEntry& entry) {
    const auto path = folder / entry.dataFile;
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        throw std::string("the backup's data file " + path.string() + " cannot be read");
    }
    std::ostringstream content;
    content << in.rdbuf();
    const std::string bytes = std::move(content).str();
    if (bytes.size() != entry.bytes || platform::sha256Hex(bytes) != entry.sha256) {
        throw std::string("the backup's data file " + path.string() +
                          " is not what was saved (its size or SHA-256 differs from the "
                          "manifest); it is not written to the analyzer");
    }
    const RcvrCharImage image = RcvrCharImage::fromBytes(bytes);
    if (context.analyzer.ismmwave() != entry.flashFile.empty()) {
        throw std::string(entry.flashFile.empty()
                              ? "the backup is of a per-port data file, but this analyzer keeps "
                                "characterizations in flash"
                              : "the backup is of a flash calibration, but this analyzer keeps "
                                "characterizations in per-port data files");
    }
    if (context.backups) {
        context.backups->save(context, {entry.receiver}, BackupReason::Restore);
    }
    if (context.analyzer.ismmwave()) {
        pushPortFile(context, entry.receiver, image);
    } else {
        writeFlashVerified(context, entry.flashFile, entry.flashName, image);
    }
    context.log.append("diag:fcal:load");
    context.analyzer.sendscpi("diag:fcal:load");
    context.clock.wait(std::chrono::milliseconds(1000));
    reportAnalyzerErrors(context, "SCPI Error Loading Flash");
    if (readStoredImage(context, entry.receiver) != image) {
        throw std::string("the analyzer's copy of " + entry.receiver +
                          " did not read back equal to the backup");
    }
}

}  // namespace storage
