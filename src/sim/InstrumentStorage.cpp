// Flash seeding and the millimetre-wave per-port data files of the simulated instrument.

#include <fstream>

#include "sim/Instrument.h"
#include "sim/StoredImage.h"

namespace sim {
namespace {

const char* seedMarker = "seeded";

std::string testReceiverOfPort(int port) {
    return std::string(1, static_cast<char>('A' + port - 1));
}

}  // namespace

void Instrument::seedStoredCalibrations() {
    // Only a fresh state directory is seeded, so that an erase stays erased across runs.
    auto marker = m_stateDirectory / seedMarker;
    if (std::filesystem::exists(marker)) {
        return;
    }
    const auto now = std::chrono::system_clock::now();
    for (const auto& stored : m_scenario.stored) {
        const ReceiverParameters& physics = m_scenario.receiver(stored.receiver);
        std::vector<std::uint16_t> image =
            stored.records ? makeStoredImage(stored.receiver, physics, *stored.records)
                           : makeStoredBlock(stored.receiver, physics, *stored.words);
        auto when = now - std::chrono::duration_cast<std::chrono::system_clock::duration>(
                              std::chrono::duration<double>(stored.ageDays * 86400.0));
        if (isMillimetreWave()) {
            int port =
                stored.receiver[0] == 'R' ? stored.receiver[1] - '0' : stored.receiver[0] - 'A' + 1;
            const char* file = stored.receiver[0] == 'R' ? "RcvrCharRef.dat" : "RcvrCharTest.dat";
            writeWordFile(portDataFolder(port) / file, image, when);
        } else {
            m_flash.write("RCVRCHAR", stored.receiver, image, when);
        }
    }
    std::ofstream(marker) << "stored calibrations of the scenario were put in place\n";
}

void Instrument::pushPortData(int port) {
    if (!isMillimetreWave()) {
        return;  // no per-port data on this configuration; the analyzer ignores the push
    }
    auto folder = portDataFolder(port);
    if (!std::filesystem::is_directory(folder)) {
        throw scpi::Error{-256, "File name not found; " + folder.string()};
    }
    const std::pair<const char*, std::string> files[] = {
        {"RcvrCharRef.dat", "R" + std::to_string(port)},
        {"RcvrCharTest.dat", testReceiverOfPort(port)},
    };
    for (const auto& [file, receiver] : files) {
        auto path = folder / file;
        if (!std::filesystem::exists(path)) {
            m_flash.erase("RCVRCHAR", receiver);
            continue;
        }
        if (std::filesystem::file_size(path) % 2 != 0) {
            throw scpi::Error{-200, std::string("Execution error; odd length of ") + file};
        }
        m_flash.write("RCVRCHAR", receiver, *readWordFile(path), std::chrono::system_clock::now());
    }
}

}  // namespace sim
