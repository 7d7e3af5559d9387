#include "engine/TestParameters.h"

#include <cmath>

#include "config/NAData.h"
#include "platform/NumberText.h"

namespace engine {

namespace {

// A ladder longer than this is a configuration mistake (a step near zero), not a test.
constexpr double kMaxLadderLevels = 100000;

std::string ladderText(const std::string& startKey, double start, const std::string& stopKey,
                       double stop, const std::string& stepKey, double step) {
    return startKey + " " + platform::generalText(start) + ", " + stopKey + " " +
           platform::generalText(stop) + ", " + stepKey + " " + platform::generalText(step);
}

}  // namespace

std::vector<double> powerLadder(double start, double stop, double step) {
    const double count = (stop - start) / step + 1.00001;
    std::vector<double> ladder;
    if (!(count >= 1) || count > kMaxLadderLevels) {
        return ladder;
    }
    const auto levels = static_cast<std::size_t>(count);
    ladder.reserve(levels);
    double power = start;
    for (std::size_t i = 0; i < levels; ++i) {
        ladder.push_back(power);
        power += step;
    }
    return ladder;
}

RunConstants readRunConstants(CNAData& config) {
    RunConstants constants;
    constants.minband = static_cast<int>(config.GetConstant("minband"));
    if (config.HasConstant("LFEminband")) {
        constants.lfeMinband = static_cast<int>(config.GetConstant("LFEminband"));
    }
    const double testStart = config.GetConstant("teststartpower");
    const double testStop = config.GetConstant("teststoppower");
    double lfeStop = 0.0;
    if (config.HasConstant("LFEteststoppower")) {
        lfeStop = std::trunc(config.GetConstant("LFEteststoppower"));
    }
    const double testStep = config.GetConstant("testpowerstep");
    constants.rchannelMinband = static_cast<int>(config.GetConstant("RChannel_minband"));
    const double refMin = config.GetConstant("RChannelPwr_TstMin");
    const double refMax = config.GetConstant("RChannelPwr_TstMx");
    const double refStep = config.GetConstant("RChannelPwr_TstStep");

    constants.testLadder = powerLadder(testStart, testStop, testStep);
    constants.lfeLadder = powerLadder(testStart, lfeStop, testStep);
    constants.referenceLadder = powerLadder(refMin, refMax, refStep);
    constants.testKeys = ladderText("teststartpower", testStart, "teststoppower", testStop,
                                    "testpowerstep", testStep);
    constants.lfeKeys = ladderText("teststartpower", testStart, "LFEteststoppower", lfeStop,
                                   "testpowerstep", testStep);
    constants.referenceKeys = ladderText("RChannelPwr_TstMin", refMin, "RChannelPwr_TstMx", refMax,
                                         "RChannelPwr_TstStep", refStep);
    return constants;
}

bool isReferenceReceiver(const std::string& name) {
    return name.find('R') != std::string::npos;
}

std::string receiverLabel(const std::string& name) {
    return name.substr(0, name.find(" LOW FREQUENCY EXTENSION"));
}

ReceiverSetup chooseReceiverSetup(const RunConstants& constants, const std::string& name,
                                  const std::string& runSearchMode) {
    ReceiverSetup setup;
    setup.lfe = name.find("LOW FREQUENCY EXTENSION") != std::string::npos;
    setup.reference = setup.lfe || isReferenceReceiver(name);
    setup.searchMode = setup.lfe ? std::string("Port-Search") : runSearchMode;
    setup.portMode = setup.searchMode.find("Direct") == std::string::npos;
    if (setup.lfe) {
        setup.ladder = &constants.lfeLadder;
        setup.ladderKeys = constants.lfeKeys;
        setup.firstBand = constants.lfeMinband;
    } else if (setup.reference && !setup.portMode) {
        setup.ladder = &constants.referenceLadder;
        setup.ladderKeys = constants.referenceKeys;
        setup.firstBand = constants.rchannelMinband;
    } else {
        setup.ladder = &constants.testLadder;
        setup.ladderKeys = constants.testKeys;
        setup.firstBand = constants.minband;
    }
    return setup;
}

double referencePower(CNAData& config, const ReceiverSetup& setup) {
    if (setup.reference || setup.portMode) {
        return config.GetConstant("RChannelRef");
    }
    return config.GetConstant("refpower");
}

void requireLevels(const ReceiverSetup& setup) {
    if (setup.ladder->empty()) {
        throw std::string("The power ladder " + setup.ladderKeys + " has no levels");
    }
}

}  // namespace engine
