#include "storage/BackupManifest.h"

#include <algorithm>
#include <fstream>
#include <nlohmann/json.hpp>
#include <sstream>

namespace storage {

std::string manifestJson(const BackupManifest& manifest) {
    nlohmann::ordered_json receivers = nlohmann::ordered_json::array();
    for (const auto& e : manifest.entries) {
        receivers.push_back({
            {"receiver", e.receiver},
            {"data_file", e.dataFile},
            {"export_file", e.exportFile},
            {"flash_file", e.flashFile},
            {"flash_name", e.flashName},
            {"port_data_path", e.portDataPath},
            {"bytes", e.bytes},
            {"catalog_date", e.catalogDate},
            {"time_read", e.timeRead},
            {"sha256", e.sha256},
            {"reason", e.reason},
        });
    }
    nlohmann::ordered_json json = {
        {"idn", manifest.idn},
        {"serial", manifest.serial},
        {"model", manifest.model},
        {"options", manifest.options},
        {"millimetre_wave", manifest.millimetreWave},
        {"receivers", receivers},
    };
    return json.dump(2) + "\n";
}

namespace {

template <typename T>
T member(const nlohmann::json& object, const char* name) {
    if (!object.contains(name)) {
        throw std::string("has no \"") + name + "\"";
    }
    return object.at(name).get<T>();
}

}  // namespace

BackupManifest readManifest(const std::filesystem::path& folder) {
    const auto path = folder / kManifestFile;
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        throw std::string("Cannot read the backup manifest " + path.string() +
                          ": no such file, or it cannot be opened");
    }
    try {
        const auto json = nlohmann::json::parse(in);
        BackupManifest manifest;
        manifest.idn = member<std::string>(json, "idn");
        manifest.serial = member<std::string>(json, "serial");
        manifest.model = member<std::string>(json, "model");
        manifest.options = member<std::vector<std::string>>(json, "options");
        manifest.millimetreWave = member<bool>(json, "millimetre_wave");
        for (const auto& r : member<nlohmann::json>(json, "receivers")) {
            BackupEntry e;
            e.receiver = member<std::string>(r, "receiver");
            e.dataFile = member<std::string>(r, "data_file");
            e.exportFile = member<std::string>(r, "export_file");
            e.flashFile = member<std::string>(r, "flash_file");
            e.flashName = member<std::string>(r, "flash_name");
            e.portDataPath = member<std::string>(r, "port_data_path");
            e.bytes = member<std::uint64_t>(r, "bytes");
            e.catalogDate = member<std::string>(r, "catalog_date");
            e.timeRead = member<std::string>(r, "time_read");
            e.sha256 = member<std::string>(r, "sha256");
            e.reason = member<std::string>(r, "reason");
            if (e.dataFile.empty() || e.dataFile.find_first_of("/\\") != std::string::npos) {
                throw std::string("names the data file \"" + e.dataFile +
                                  "\", which is not a file name in the backup folder");
            }
            manifest.entries.push_back(std::move(e));
        }
        return manifest;
    } catch (const nlohmann::json::exception& e) {
        throw std::string("The backup manifest " + path.string() + " is not valid: " + e.what());
    } catch (const std::string& reason) {
        throw std::string("The backup manifest " + path.string() + " " + reason);
    }
}

std::string serialOf(const std::string& idn) {
    std::vector<std::string> fields;
    std::stringstream text(idn);
    for (std::string field; std::getline(text, field, ',');) {
        fields.push_back(field);
    }
    if (fields.size() < 3) {
        return {};
    }
    std::string serial = fields[2];
    serial.erase(0, serial.find_first_not_of(' '));
    serial.erase(serial.find_last_not_of(" \r\n") + 1);
    return serial;
}

std::vector<BackupFolder> listBackups(const std::filesystem::path& root,
                                      std::vector<std::string>& unreadable) {
    std::vector<BackupFolder> folders;
    std::error_code ec;
    for (const auto& item : std::filesystem::directory_iterator(root, ec)) {
        if (!item.is_directory()) {
            continue;
        }
        try {
            folders.push_back({item.path(), readManifest(item.path())});
        } catch (const std::string& reason) {
            unreadable.push_back(reason);
        }
    }
    std::sort(folders.begin(), folders.end(),
              [](const auto& a, const auto& b) { return a.folder < b.folder; });
    return folders;
}

}  // namespace storage
