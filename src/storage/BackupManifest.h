#pragma once

// "manifest.json" of a backup folder: which instrument the backup was read from and, per
// receiver, where its characterization was stored, what was read and when.

#include <cstdint>
#include <filesystem>
#include <string>
#include <vector>

namespace storage {

struct BackupEntry {
    std::string receiver;      // short name, e.g. "R1" or "R1_LFE"
    std::string dataFile;      // image bytes, in the backup folder
    std::string exportFile;    // export text, in the backup folder; empty for a headless image
    std::string flashFile;     // flash file ("RcvrChar"); empty on millimetre-wave systems
    std::string flashName;     // calibration name in the flash file
    std::string portDataPath;  // per-port data file on millimetre-wave systems, else empty
    std::uint64_t bytes = 0;
    std::string catalogDate;  // as the catalog or directory listing gave it
    std::string timeRead;     // local time, ISO 8601
    std::string sha256;       // of the data file
    std::string reason;       // "erase", "overwrite", "replace" or "restore"
};

struct BackupManifest {
    std::string idn;  // the instrument's *IDN? reply
    std::string serial;
    std::string model;
    std::vector<std::string> options;
    bool millimetreWave = false;
    std::vector<BackupEntry> entries;
};

inline constexpr const char* kManifestFile = "manifest.json";

std::string manifestJson(const BackupManifest& manifest);
// Raises an error text naming the file and what is wrong with it.
BackupManifest readManifest(const std::filesystem::path& folder);

// The serial number field of an *IDN? reply (maker,model,serial,firmware); empty if none.
std::string serialOf(const std::string& idn);

struct BackupFolder {
    std::filesystem::path folder;
    BackupManifest manifest;
};

// Every folder under root that holds a readable manifest, oldest name first; folders whose
// manifest cannot be read are returned in `unreadable` with the reason.
std::vector<BackupFolder> listBackups(const std::filesystem::path& root,
                                      std::vector<std::string>& unreadable);

}  // namespace storage
