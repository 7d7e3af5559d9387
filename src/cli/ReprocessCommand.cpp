// `rcvrchar reprocess`: judges a receiver's raw measured-data CSV again without the analyzer,
// rebuilding the band plan and ladder from the configuration as a run would, and writes the
// raw result file and the image.

#include <iostream>

#include "cli/CommandRegistry.h"
#include "config/OptionReply.h"
#include "config/T3872Acomcal.h"
#include "engine/CompressionData.h"
#include "engine/MeasuredDataImport.h"
#include "engine/TestParameters.h"
#include "platform/ScriptedOperatorUi.h"
#include "platform/WholeFile.h"
#include "storage/ReceiverNames.h"
#include "storage/ResultProcessing.h"

namespace {

struct ReprocessOptions {
    std::string csv;
    std::string receiver;
    std::string model;
    std::string options;
    std::string file = "RcvrChar.dat";
    std::string searchMode = "Port-Search";
    double nbLoss = -3;
    std::string nbAtten = "30";
    bool mmwave = false;
    std::string onBadData = "retest";
    std::string out;
};

constexpr int kFailedCriteria = 2;

int reprocess(const ReprocessOptions& options) {
    CT3872Acomcal config;
    config.SetModel(options.model);
    // "010, 080" as typed on a command line means the options 010 and 080.
    std::vector<std::string> optionList = SplitOptionReply(options.options);
    for (auto& option : optionList) {
        const auto first = option.find_first_not_of(" \t");
        const auto last = option.find_last_not_of(" \t");
        option =
            first == std::string::npos ? std::string() : option.substr(first, last - first + 1);
    }
    config.SetOptions(optionList);
    config.ReadSequence(options.file);
    std::string known;
    bool found = false;
    for (const auto& calibration : config.GetCalibrations()) {
        found = found || calibration.GetName() == options.receiver;
        known += (known.empty() ? "" : ", ") + calibration.GetName();
    }
    if (!found) {
        throw std::string("--receiver " + options.receiver + " is not a receiver of the " +
                          options.model + " with options \"" + options.options + "\"; its " +
                          "receivers are " + known);
    }

    const engine::RunConstants constants = engine::readRunConstants(config);
    const engine::ReceiverSetup setup =
        engine::chooseReceiverSetup(constants, options.receiver, options.searchMode);
    engine::requireLevels(setup);
    config.SetLFEMode(setup.lfe);

    platform::ScriptedOperatorUi ui;
    ui.answerAll(platform::Answer::Ok);
    // Quitting is answered like a retest: no image, and the status tells it failed.
    ui.badData({options.onBadData == "default" ? platform::BadDataChoice::Continue
                                               : platform::BadDataChoice::Retest});

    engine::CCompressionData store(ui);
    store.loadTestParameters(config, setup.firstBand);
    store.setPowerLevels(*setup.ladder);
    engine::readAllMeasuredData(store, options.csv);
    store.setNarrowbandLoss(static_cast<float>(options.nbLoss));
    store.setNarrowbandAtten(options.nbAtten);

    const std::string shortName = storage::shortReceiverName(options.receiver);
    const std::filesystem::path out(options.out);
    const auto judgement = storage::judgeResults(store, shortName, options.mmwave,
                                                 out / ("rcvrCharRaw_" + shortName + ".txt"), ui);
    if (judgement.accepted) {
        const std::string name = "RcvrChar_" + shortName + ".dat";
        platform::writeWholeFile(out / name, judgement.image.bytes(), "the image " + name);
    }
    if (!judgement.rawFileError.empty()) {
        throw judgement.rawFileError;
    }
    if (judgement.passed) {
        return 0;
    }
    std::cerr << (options.onBadData == "quit"
                      ? "User aborted characterization due to bad data on receiver " + shortName
                      : "The data of receiver " + shortName + " failed the bad-connection criteria")
              << "\n";
    return kFailedCriteria;
}

cli::CommandRegistration registration("reprocess", [](CLI::App& app) -> std::function<int()> {
    auto options = std::make_shared<ReprocessOptions>();
    app.description(
        "Judge a receiver's raw measured-data CSV again without the analyzer.\n"
        "Example: rcvrchar reprocess --csv RcvrChar_AllMeasuredData_A.csv --receiver A "
        "--model T3872A --options 010,080 --out results\n"
        "Exit status: 0 the data passed, 2 it failed the criteria, 1 an error.");
    app.add_option("--csv", options->csv, "raw CSV written by a run")
        ->required()
        ->check(CLI::ExistingFile);
    app.add_option("--receiver", options->receiver, "receiver name, e.g. A or R1")->required();
    app.add_option("--model", options->model, "analyzer model, e.g. T3872A")->required();
    app.add_option("--options", options->options, "installed options, e.g. 010,080");
    app.add_option("--file", options->file, "configuration file")->capture_default_str();
    app.add_option("--search-mode", options->searchMode, "search mode of the run")
        ->check(CLI::IsMember({"Direct-Search", "Port-Search"}))
        ->capture_default_str();
    app.add_option("--nb-loss", options->nbLoss, "narrowband loss in dB")->capture_default_str();
    app.add_option("--nb-atten", options->nbAtten, "narrowband attenuator setting")
        ->capture_default_str();
    app.add_flag("--mmwave", options->mmwave, "judge as on a millimetre-wave system");
    app.add_option("--on-bad-data", options->onBadData,
                   "answer to bad data: retest or quit (no image), default (defaulted image)")
        ->check(CLI::IsMember({"retest", "quit", "default"}))
        ->capture_default_str();
    app.add_option("--out", options->out, "directory for the raw result file and the image")
        ->required()
        ->check(CLI::ExistingDirectory);
    return [options] { return reprocess(*options); };
});

}  // namespace
