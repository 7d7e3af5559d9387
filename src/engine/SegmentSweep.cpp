#include "engine/SegmentSweep.h"

#include <algorithm>
#include <chrono>
#include <cmath>

#include "analyzer/NetworkAnalyzerClass.h"
#include "config/NAData.h"
#include "engine/CompressionData.h"
#include "engine/ConnectionCheck.h"
#include "engine/TestParameters.h"

namespace engine {

namespace {

// Reading into a buffer of the channel's points; an empty channel leaves nothing to read.
std::vector<float> pointBuffer(CNetworkAnalyzer& proxy) {
    const long points = proxy.readnumberofpoints(false);
    if (points <= 0) {
        throw std::string("The analyzer channel reports " + std::to_string(points) +
                          " points: there is no trace to read");
    }
    return std::vector<float>(static_cast<std::size_t>(points));
}

void startAveraging(CNetworkAnalyzer& proxy, double averages) {
    proxy.sendscpi("SENS:AVER:STAT ON");
    proxy.sendscpi("SENS:AVER:CLE");
    proxy.sendscpi("SENS:AVER:COUN " + std::to_string(std::lround(averages)));
}

void averagedSweeps(SweepContext& context, double averages) {
    const auto sweeps = static_cast<long>(averages);
    for (long i = 0; i < sweeps; ++i) {
        context.checkabort();
        context.proxy.sweep(false);
    }
}

void readInto(SweepContext& context, const std::string& name, const std::string& format,
              std::vector<float>& buffer, const std::string& type, int level) {
    const long read = context.proxy.readdata(name, format, buffer);
    const auto count = std::min(static_cast<std::size_t>(std::max(read, 0L)), buffer.size());
    context.store.putTrace(type, std::span<const float>(buffer.data(), count), level);
}

}  // namespace

void setupSegmentSweep(SweepContext& context, int first, int last,
                       const std::vector<double>& powers) {
    const CCompressionData& store = context.store;
    context.proxy.setsegments(store.getBandStarts(), store.getBandStops(), store.getBandPoints(),
                              store.getBandIfbws(), powers, first, last);
}

bool prepareSegment(SweepContext& context, double referencePower, const std::string& receiver,
                    const std::string& portText, const std::string& searchMode, int first, int last,
                    int segment) {
    CNetworkAnalyzer& proxy = context.proxy;
    CNAData& config = context.config;
    proxy.setupchannel();
    proxy.setsourcepower(referencePower, true);
    if (config.GetLFEMode()) {
        proxy.sendscpi("SENS:SWE:LFEX:STAT ON");
    }

    InstructionInputs inputs;
    inputs.label = receiverLabel(receiver);
    inputs.reference = isReferenceReceiver(inputs.label);
    inputs.portMode = searchMode.find("Direct") == std::string::npos;
    inputs.lfe = config.GetLFEMode();
    inputs.segment = segment;

    const double refAverages = config.GetConstant("refaverages");
    const int ifbwOnOff = static_cast<int>(config.GetConstant("IFBWOnOff"));
    if (!inputs.reference) {
        inputs.testAtten = static_cast<int>(config.GetConstant("testAtten"));
    }
    inputs.rChannelAtten = static_cast<int>(config.GetConstant("RChannelAtten"));
    inputs.externalR1 = static_cast<int>(config.GetConstant("ExternalR1"));
    const std::string model = proxy.readmodel(false);

    inputs.fields = parsePortText(receiver, portText);
    const std::string& port = inputs.fields.port;
    context.checkabort();

    const Instructions instructions = connectionInstructions(inputs);
    showInstructions(context, inputs, instructions);
    context.checkabort();

    bool settle = false;
    if (!inputs.portMode && (inputs.label == "R1" || (port == "1" && inputs.externalR1 != 0))) {
        proxy.sendscpi("SENSe:PATH:CONF:ELEMent:STATe \"Port1RefMxr\",\"External\"");
        proxy.sweep(false);
        context.clock.wait(std::chrono::milliseconds(10000));
        settle = true;
    }
    checkConnection(context, inputs.label, port, settle);
    if (!proxy.ismmwave()) {
        proxy.sendscpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"WBF\"");
        context.clock.wait(std::chrono::milliseconds(1000));
    }
    context.checkabort();

    if (model.find("T395") == std::string::npos && inputs.portMode && !inputs.reference) {
        proxy.sendscpi("DIAG:RXCAL:STATE ON");
        proxy.sendscpi("DIAG:CMPCAL:STATE ON");
        proxy.sendscpi("DIAG:MXCAL:STATE OFF");
    } else {
        proxy.sendscpi("DIAG:RXCAL:STATE OFF");
    }
    proxy.sendscpi("CALC:PAR:DEL:ALL");
    proxy.sendscpi("CALC:PAR:DEF:EXT \"measmag\",\"" + inputs.label + "," + port + "\"");
    proxy.sendscpi("DISP:WIND:TRACE1:FEED \"measmag\"");
    if (!inputs.fields.sweepParameter.empty()) {
        proxy.sendscpi("DIAG:SWEEP_PARM \"" + inputs.fields.sweepParameter + "\",\"TRUE\"");
    }
    proxy.sendscpi("CALC:PAR:DEF:EXT \"measratio\",\"" + inputs.fields.ratioParameter + "," + port +
                   "\"");
    proxy.sendscpi("DISP:WIND:TRACE2:FEED \"measratio\"");
    if (ifbwOnOff == 0) {
        proxy.setchannelswitch(false);
    }
    setupSegmentSweep(context, first, last, context.store.getBandRefPowers());
    proxy.sweep(false);
    const auto buffer = pointBuffer(proxy);
    if (inputs.portMode) {
        checkPowerRatio(context, model, static_cast<long>(buffer.size()), instructions,
                        inputs.label);
    }

    proxy.sweep(false);
    startAveraging(proxy, refAverages);
    proxy.sendscpi("CALC:PAR:SEL \"measmag\"");
    proxy.sendscpi("CALC:FUNCTION:STAT ON");
    proxy.sendscpi("CALC:PAR:SEL \"measratio\"");
    proxy.sendscpi("CALC:FUNCTION:STAT ON");
    averagedSweeps(context, refAverages);

    proxy.sendscpi("CALC:PAR:SEL \"measmag\"");
    proxy.sendscpi("DISP:WIND:TRACE1:SEL");
    proxy.sendscpi("DISP:WIND:TRACE1:STAT ON");
    proxy.refreshmeasurements();
    proxy.sendscpi("CALC:PAR:SEL \"measratio\"");
    proxy.sendscpi("DISP:WIND:TRACE2:SEL");
    proxy.sendscpi("CALC:math:mem");
    proxy.sendscpi("CALC:math:func div");
    proxy.sendscpi("display:window:trace2:y:pdivision 0.1");

    context.connection.pad = instructions.expectedPad;
    return false;
}

void measurePowerLevel(SweepContext& context, double power, int level, int first, int last) {
    CNetworkAnalyzer& proxy = context.proxy;
    const double averages = context.config.GetConstant("testaverages");
    auto buffer = pointBuffer(proxy);

    std::vector<double> powers = context.store.getBandPowerLimits();
    for (double& segmentPower : powers) {
        segmentPower = std::min(segmentPower, power);
    }
    setupSegmentSweep(context, first, last, powers);

    proxy.sendscpi("SENS:AVER:STAT OFF");
    proxy.sweep(false);
    startAveraging(proxy, averages);
    averagedSweeps(context, averages);

    proxy.sendscpi("DISP:WIND:TRACE1:SEL");
    readInto(context, "measmag", "LOGMAG", buffer, "TestMag", level);
    proxy.sendscpi("DISP:WIND:TRACE2:SEL");
    readInto(context, "measratio", "LOGMAG", buffer, "RatioMag", level);
    readInto(context, "measratio", "PHASE", buffer, "Phase", level);
}

}  // namespace engine
