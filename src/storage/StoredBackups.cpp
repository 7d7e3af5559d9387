#include "storage/StoredBackups.h"

#include <cctype>
#include <chrono>
#include <ctime>
#include <sstream>

#include "analyzer/NetworkAnalyzerClass.h"
#include "platform/ErrorText.h"
#include "platform/Sha256.h"
#include "platform/WholeFile.h"
#include "storage/BackupManifest.h"
#include "storage/ExportText.h"
#include "storage/FlashCatalog.h"
#include "storage/PortDataFile.h"
#include "storage/ReceiverNames.h"
#include "storage/StoredImage.h"

namespace storage {
namespace {

std::string localTime(std::time_t when, const char* format) {
    std::tm local{};
    localtime_r(&when, &local);
    char text[64];
    std::strftime(text, sizeof text, format, &local);
    return text;
}

std::string reasonName(BackupReason reason) {
    switch (reason) {
        case BackupReason::Erase:
            return "erase";
        case BackupReason::Overwrite:
            return "overwrite";
        case BackupReason::Restore:
            return "restore";
    }
    return "erase";
}

std::string notDone(BackupReason reason) {
    switch (reason) {
        case BackupReason::Erase:
            return "Nothing has been erased.";
        case BackupReason::Overwrite:
            return "The stored characterization has not been replaced.";
        case BackupReason::Restore:
            return "Nothing has been restored over it.";
    }
    return {};
}

// Letters, digits, '-' and '_' only, so that any serial number makes a folder name.
std::string folderSafe(const std::string& text) {
    std::string safe;
    for (char c : text) {
        const bool plain = std::isalnum(static_cast<unsigned char>(c)) || c == '-' || c == '_';
        safe += plain ? c : '_';
    }
    return safe.empty() ? "unknown" : safe;
}

// A folder that does not exist yet: the name, or the name with "-2", "-3", ...
std::filesystem::path newFolder(const std::filesystem::path& root, const std::string& name) {
    std::filesystem::path folder = root / name;
    for (int n = 2; std::filesystem::exists(folder); ++n) {
        folder = root / (name + "-" + std::to_string(n));
    }
    return folder;
}

struct ReadImage {
    std::string receiver;
    BackupEntry entry;
    RcvrCharImage image;
};

}  // namespace

StoredBackups::StoredBackups(std::filesystem::path root, platform::ProcessRunner& processes)
    : m_root(std::move(root)), m_processes(processes) {}

std::filesystem::path StoredBackups::save(const StorageContext& context,
                                          const std::vector<std::string>& receivers,
                                          BackupReason reason) {
    const std::time_t now = std::chrono::system_clock::to_time_t(std::chrono::system_clock::now());
    BackupManifest manifest;
    std::vector<ReadImage> images;
    std::string current;
    try {
        for (const auto& receiver : receivers) {
            current = receiver;
            const auto stored = catalogEntry(context, m_processes, receiver);
            if (!stored) {
                continue;
            }
            ReadImage read{receiver, {}, readStoredImage(context, receiver)};
            BackupEntry& e = read.entry;
            e.receiver = shortReceiverName(receiver);
            e.dataFile = "RcvrChar_" + e.receiver + ".dat";
            e.catalogDate = stored->date;
            e.timeRead = localTime(now, "%Y-%m-%dT%H:%M:%S%z");
            e.reason = reasonName(reason);
            if (context.analyzer.ismmwave()) {
                e.portDataPath = portDataFile(context.analyzer.readmodel(false), receiver).path;
            } else {
                e.flashFile = "RcvrChar";
                e.flashName = flashName(receiver);
            }
            const std::uint64_t readBytes = read.image.wordCount() * 2;
            if (readBytes != stored->bytes) {
                throw std::string("the analyzer gave " + std::to_string(readBytes) +
                                  " bytes, its catalog lists " + std::to_string(stored->bytes));
            }
            e.bytes = readBytes;
            images.push_back(std::move(read));
        }
        if (images.empty()) {
            return {};
        }
        manifest.idn = context.analyzer.sendscpi("*IDN?");
        manifest.serial = serialOf(manifest.idn);
        manifest.model = context.analyzer.readmodel(false);
        manifest.options = context.analyzer.readoptions(false);
        manifest.millimetreWave = context.analyzer.ismmwave();
    } catch (...) {
        throw std::string("No backup could be saved of the characterization of " + current +
                          ": it could not be read from the analyzer (" +
                          platform::currentErrorText() + "). " + notDone(reason));
    }

    std::filesystem::path folder;
    try {
        folder =
            newFolder(m_root, localTime(now, "%Y%m%d-%H%M%S") + "-" + folderSafe(manifest.serial));
        std::error_code ec;
        std::filesystem::create_directories(folder, ec);
        if (ec) {
            throw std::string("Cannot create the backup folder " + folder.string() + ": " +
                              ec.message());
        }
        for (auto& read : images) {
            current = read.receiver;
            BackupEntry& e = read.entry;
            const std::string bytes = read.image.bytes();
            e.sha256 = platform::sha256Hex(bytes);
            platform::writeWholeFile(folder / e.dataFile, bytes, "the backup " + e.dataFile);
            if (read.image.completeness() != ImageCompleteness::NoHeader) {
                e.exportFile = "RcvrChar_" + e.receiver + "_Exported.txt";
                std::ostringstream text;
                writeExportText(text, read.image);
                platform::writeWholeFile(folder / e.exportFile, text.str(),
                                         "the backup " + e.exportFile);
            }
            manifest.entries.push_back(e);
        }
        platform::writeWholeFile(folder / kManifestFile, manifestJson(manifest),
                                 std::string("the backup ") + kManifestFile);
    } catch (...) {
        const std::string why = platform::currentErrorText();
        if (!folder.empty()) {
            std::error_code ignored;
            std::filesystem::remove_all(folder, ignored);
        }
        throw std::string("No backup could be saved of the characterization of " + current + ": " +
                          why + ". " + notDone(reason));
    }
    std::lock_guard lock(m_mutex);
    for (const auto& read : images) {
        m_latest[read.receiver] = folder;
    }
    return folder;
}

std::map<std::string, std::filesystem::path> StoredBackups::latest() const {
    std::lock_guard lock(m_mutex);
    return m_latest;
}

}  // namespace storage
