#pragma once

// The operator's cabling instructions for a band segment and the checks that confirm the
// set-up from measured data before compression data is taken.

#include <string>

#include "engine/PortText.h"
#include "engine/SweepContext.h"

namespace engine {

struct InstructionInputs {
    std::string label;  // receiver name without " LOW FREQUENCY EXTENSION"
    bool reference = false;
    bool portMode = false;
    bool lfe = false;
    int segment = 0;
    PortFields fields;
    int testAtten = 0;
    int rChannelAtten = 0;
    int externalR1 = 0;
};

struct Instructions {
    std::string text;
    int expectedPad = 0;  // dB the power-ratio check expects
};

Instructions connectionInstructions(const InstructionInputs& inputs);

// Shows the "Connections" box: always in direct mode; in port mode only when the cabling
// differs from the remembered one, which it then updates.
void showInstructions(SweepContext& context, const InstructionInputs& inputs,
                      const Instructions& instructions);

// Confirms that the receiver responds to the source, checks the narrowband IF path and reads
// the narrowband attenuator; stores the findings in the store. settle: wait for the readings
// to settle after the external reference path was switched in.
void checkConnection(SweepContext& context, const std::string& label, const std::string& port,
                     bool settle);

// Port mode: the ratio trace of receiver `label` must read the pad the operator was told to
// fit.
void checkPowerRatio(SweepContext& context, const std::string& model, long points,
                     const Instructions& instructions, const std::string& label);

}  // namespace engine
