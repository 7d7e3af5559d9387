#include "engine/ConnectionCheck.h"

#include <cmath>
#include <cstdlib>
#include <vector>

#include "analyzer/NetworkAnalyzerClass.h"
#include "engine/CompressionData.h"
#include "platform/NumberText.h"

namespace engine {

namespace {

using platform::Answer;
using platform::Buttons;

constexpr const char* kMeasureFormat = "LOGMAG";

float sweepAndRead(SweepContext& context) {
    context.proxy.sweep(false);
    return context.proxy.readcurrentvalue(kMeasureFormat);
}

std::string directText(const InstructionInputs& in) {
    const std::string& port = in.fields.port;
    std::string text;
    if (in.rChannelAtten != 0 && !(port == "1" && in.externalR1 != 0)) {
        const std::string jumper = "\"RCVR R" + port + " IN\"";
        text += "Remove front panel jumper from port " + jumper + ".\r\n";
        text += "Connect " + std::to_string(in.rChannelAtten) + " dB pad between " + jumper +
                " and \"SRC OUT\" connector.\r\n";
    }
    text += "Connect cable to Port " + port + ".\r\n\r\n";
    if (in.testAtten != 0) {
        text += "Connect " + std::to_string(in.testAtten) + "dB pad to cable.\r\n";
    }
    const std::string input = "\"RCVR " + in.label + " IN\"";
    text += "Remove front panel jumper from port " + input + ".\r\n";
    text += (in.testAtten != 0 ? "Connect pad to " : "Connect other end of cable to ") + input +
            ".\r\n";
    return text;
}

}  // namespace

Instructions connectionInstructions(const InstructionInputs& in) {
    if (!in.portMode) {
        return {directText(in), 0};
    }
    const std::string& port = in.fields.port;
    const std::string& destination = in.fields.destination;
    if (!in.reference) {
        return {"Connect cable from PORT " + port + " to " + destination + " (with no pad).", 0};
    }
    if (in.segment == 0) {
        const int pad = in.lfe ? 30 : 20;
        return {"Connect cable to PORT " + port + ".\r\nConnect ** " + std::to_string(pad) +
                    " ** pad to cable.\r\nConnect pad to " + destination,
                pad};
    }
    return {"Connect cable to PORT " + port +
                ".\r\nConnect one port of Lossy Delay Line 40317-11012 to cable.\r\nConnect "
                "other port of Delay Line directly to " +
                destination,
            21};
}

void showInstructions(SweepContext& context, const InstructionInputs& inputs,
                      const Instructions& instructions) {
    RememberedConnection& last = context.connection;
    if (inputs.portMode) {
        const std::string portText = "PORT " + inputs.fields.port;
        if (instructions.expectedPad == last.pad && portText == last.portText &&
            inputs.fields.destination == last.destination) {
            return;
        }
        last.portText = portText;
        last.destination = inputs.fields.destination;
    }
    context.ui.messageBox(
        {instructions.text, "Connections", Buttons::Ok,
         platform::BoxIconInformation | platform::BoxSystemModal | platform::BoxTopmost});
}

void checkConnection(SweepContext& context, const std::string& label, const std::string& port,
                     bool settle) {
    CNetworkAnalyzer& proxy = context.proxy;
    if (proxy.ismmwave()) {
        context.store.setNarrowbandLoss(-2.0f);
        context.store.setNarrowbandAtten("30");
        return;
    }
    const double p0 = proxy.readsourcepower(true);
    proxy.sendscpi("DIAG:RXCAL:STATE OFF");
    context.clock.wait(std::chrono::milliseconds(100));
    proxy.sendscpi("CALC:PAR:DEL:ALL");
    proxy.sendscpi("CALC:PAR:DEF:EXT \"measmag\",\"" + label + "," + port + "\"");
    proxy.sendscpi("DISP:WIND:TRACE1:FEED \"measmag\"");
    proxy.setsweeptype("cw");
    proxy.primemeasurement();
    proxy.setcwfrequency(1000000000.0);
    proxy.setifbandwidth(1000);

    float wideband = 0;
    while (true) {
        context.checkabort();
        wideband = sweepAndRead(context);
        if (settle) {
            for (int i = 0; i < 100; ++i) {
                const float next = sweepAndRead(context);
                const bool settled = std::fabs(next - wideband) <= 0.0001;
                wideband = next;
                if (settled) {
                    break;
                }
            }
        }
        proxy.setsourcepower(p0 + 5.0, true);
        const float raised = sweepAndRead(context);
        if (raised - wideband >= 2.0) {
            break;
        }
        const Answer retry = context.ui.messageBox(
            {"Receiver " + label + " In does not seem to be connected to source Port " + port +
                 "\nPlease check connection\nRetry? (no will continue)",
             "Check Connection", Buttons::YesNo, platform::BoxTopmost, label + " connection"});
        if (retry != Answer::Yes) {
            break;
        }
        proxy.setsourcepower(p0, true);
    }
    proxy.setsourcepower(p0, true);

    float narrowband = 0;
    for (int attempt = 0; attempt < 4; ++attempt) {
        proxy.sendscpi("SENS:PATH:CONF:ELEM \"IFSIGPATHALL\",\"NBF\"");
        context.clock.wait(std::chrono::milliseconds(100));
        proxy.sweep(false);
        context.clock.wait(std::chrono::milliseconds(100));
        narrowband = proxy.readcurrentvalue(kMeasureFormat);
        if (std::fabs(narrowband - wideband) <= 5.0) {
            break;
        }
    }
    const float loss = narrowband - wideband;
    if (std::fabs(loss) > 10.0) {
        const std::string text =
            "Receiver " + label + " appears to have an issue with narrow band path " +
            "\nThe expected difference (wideband - narrowband) is about -3 "
            "+/- 2 dB\nThe loss measured is " +
            platform::generalText(loss) + "\nPress OK to continue or Cancel to Abort";
        if (context.ui.messageBox({text, "Narrow band IF filter path issue", Buttons::OkCancel,
                                   platform::BoxSystemModal | platform::BoxTopmost}) !=
            Answer::Ok) {
            throw text;
        }
    }

    std::string reply;
    for (int attempt = 0; attempt < 4 && reply.empty(); ++attempt) {
        context.clock.wait(std::chrono::milliseconds(100));
        reply = proxy.sendscpi("SENS:PATH:CONF:ELEM? \"NBFATN" + label + "\"");
    }
    std::string setting;
    if (reply.size() >= 3) {
        setting = reply.substr(1, 2);
    } else {
        const std::string text =
            "Could not determine narrow band attenuator setting for receiver " + label +
            "\n\nContinue using default 30 dB setting? (Cancel will "
            "abort)";
        if (context.ui.messageBox({text, "Narrow band attenuator issue", Buttons::OkCancel,
                                   platform::BoxSystemModal | platform::BoxTopmost}) !=
            Answer::Ok) {
            throw text;
        }
        setting = "30";
    }
    context.store.setNarrowbandLoss(loss);
    context.store.setNarrowbandAtten(setting);
}

void checkPowerRatio(SweepContext& context, const std::string& model, long points,
                     const Instructions& instructions, const std::string& label) {
    CNetworkAnalyzer& proxy = context.proxy;
    proxy.sendscpi("CALC:PAR:SEL \"measratio\"");
    proxy.sendscpi("DISP:WIND:TRACE2:SEL");
    proxy.refreshmeasurements();
    const bool t395 = model.find("T395") != std::string::npos;
    std::vector<float> buffer(static_cast<std::size_t>(points));
    while (true) {
        context.checkabort();
        proxy.sweep(false);
        double ratio;
        if (t395) {
            proxy.sendscpi("format:data ASC");
            proxy.sendscpi("calculate:function:type MEAN");
            ratio = std::atof(proxy.sendscpi("calculate:function:data?").c_str());
        } else {
            const long read = proxy.readdata("measratio", "LOGMAG", buffer);
            if (read <= 0) {
                throw std::string("The power-ratio check read no points of \"measratio\"");
            }
            ratio = buffer[static_cast<std::size_t>(std::min(read, points)) / 2];
        }
        if (std::fabs(ratio - instructions.expectedPad) <= 5.0) {
            return;
        }
        const std::string text =
            "Expected power ratio: " + std::to_string(instructions.expectedPad) + " +/- 5 dB\n" +
            "Power ratio read: " + platform::generalText(ratio) + "\n" +
            "Check connections, connection instructions were: \n\n" + instructions.text +
            "\n\nRetry? (no will continue)";
        if (context.ui.messageBox({text, "Unexpected power ratio reading", Buttons::YesNo,
                                   platform::BoxTopmost, label + " power ratio"}) != Answer::Yes) {
            return;
        }
    }
}

}  // namespace engine
