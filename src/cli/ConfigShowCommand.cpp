// `rcvrchar config show`: reads the configuration as the dialog does at start-up and prints
// the resulting model as one JSON object.

#include <charconv>
#include <iostream>
#include <nlohmann/json.hpp>
#include <stdexcept>
#include <string>

#include "cli/CommandRegistry.h"
#include "config/OptionReply.h"
#include "config/T3872Acomcal.h"

namespace {

// Floats are printed by their shortest text, so -12.5F shows as -12.5, not as its double.
double ShortestDouble(float value) {
    char text[32];
    auto result = std::to_chars(text, text + sizeof text, value);
    return std::stod(std::string(text, result.ptr));
}

nlohmann::ordered_json CalibrationJson(const CCalibration& calibration) {
    nlohmann::ordered_json subs = nlohmann::ordered_json::array();
    for (const auto& sub : calibration.GetSubs()) {
        subs.push_back({{"name", sub.GetName()},
                        {"position", sub.GetPosition()},
                        {"ifbw", sub.GetIFBW()},
                        {"points", sub.GetNumPoints()},
                        {"tolerance", ShortestDouble(sub.GetTolerance())}});
    }
    return {{"name", calibration.GetName()},
            {"port", calibration.GetPort()},
            {"path", calibration.GetPathConfiguration()},
            {"copy_from", calibration.GetCopyFrom()},
            {"verification", calibration.GetVerification()},
            {"subs", subs}};
}

nlohmann::ordered_json BandsJson(const std::map<int, BandDefaults>& bands) {
    nlohmann::ordered_json list = nlohmann::ordered_json::array();
    for (const auto& [number, band] : bands) {
        list.push_back({{"band", number},
                        {"start", band.m_startFreq},
                        {"stop", band.m_stopFreq},
                        {"points", band.m_points},
                        {"power_limit", band.m_powerLimit}});
    }
    return list;
}

nlohmann::ordered_json ConfigurationJson(const CT3872Acomcal& config) {
    nlohmann::ordered_json calibrations = nlohmann::ordered_json::array();
    for (const auto& calibration : config.GetCalibrations()) {
        calibrations.push_back(CalibrationJson(calibration));
    }
    nlohmann::ordered_json presets = nlohmann::ordered_json::object();
    for (const auto& [name, power] : config.GetPresetPowers()) {
        presets[name] = ShortestDouble(power);
    }
    nlohmann::ordered_json sensors = nlohmann::ordered_json::object();
    for (const auto& [name, range] : config.GetSensorRanges()) {
        sensors[name] = {{"min", range.m_min}, {"max", range.m_max}};
    }
    std::vector<std::string> order;
    config.GetOrder(order);
    // The dialog's receiver list and its start-up prerequisites.
    const auto& ports = config.RequiredPorts();
    std::vector<std::string> receivers = order.empty() ? config.CalibrationsForPorts(ports) : order;
    bool portSearch = false;
    std::vector<std::string> prerequisites = config.Prerequisites(ports, portSearch);
    return {{"model", config.GetModel()},
            {"token", config.GetModelToken()},
            {"options", config.GetOptions()},
            {"constants", config.GetConstants()},
            {"required_ports", ports},
            {"port_assignments", config.GetPortAssignments()},
            {"calibrations", calibrations},
            {"bands", BandsJson(config.GetBands())},
            {"lfe_bands", BandsJson(config.GetLFEBands())},
            {"order", order},
            {"preset_powers", presets},
            {"sensor_ranges", sensors},
            {"receivers", receivers},
            {"prerequisites", prerequisites},
            {"port_search", portSearch}};
}

struct ShowOptions {
    std::string file = "RcvrChar.dat";
    std::string model;
    std::string options;
};

const cli::CommandRegistration kConfigCommand("config", [](CLI::App& app) {
    app.description("Inspect the configuration file");
    app.require_subcommand(1);
    auto settings = std::make_shared<ShowOptions>();
    CLI::App* show = app.add_subcommand(
        "show",
        "Read the configuration for one analyzer model and option set, as the dialog does "
        "at start-up, and print it as JSON.\nExample: rcvrchar config show --file "
        "data/RcvrChar.dat --model T3872A --options 010,080");
    show->add_option("--file", settings->file, "Configuration file")->capture_default_str();
    show->add_option("--model", settings->model, "Analyzer model, e.g. T3872A (required)");
    show->add_option("--options", settings->options,
                     "Installed options as the analyzer's \"*opt?\" reply lists them between "
                     "its quotes, e.g. 010,080 (empty: no options)");
    return std::function<int()>([settings]() {
        if (settings->model.empty()) {
            throw std::string("config show needs --model, e.g. --model T3872A");
        }
        CT3872Acomcal config;
        config.SetModel(settings->model);
        config.SetOptions(SplitOptionReply(settings->options));
        config.ReadSequence(settings->file);
        // Built completely before anything is printed, so an error leaves stdout empty.
        std::string text = ConfigurationJson(config).dump(2);
        std::cout << text << "\n";
        return 0;
    });
});

}  // namespace
