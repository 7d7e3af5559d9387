#pragma once

// Small configuration texts shared by the configuration tests.

#include <string>
#include <vector>

#include "config/Calibration.h"

namespace configtest {

// A complete configuration for model T3872A: ports 1 (after R1) and 2 (no prerequisite),
// calibrations R1, A, B (C absent), three bands and an "Order / Power" block.
inline std::string minimalConfiguration() {
    return "T3871 T3872 T3877\n"
           "\n"
           "T3872A,Value,c2,c3,c4,c5,c6,c7\n"
           "minband,2\n"
           "maxband,4\n"
           "pntsperband,5\n"
           "Required Ports,Port Names,T3872\n"
           ",Port 1,R1\n"
           ",Port 2,x\n"
           ",Port 3,0\n"
           "Calibrations / Port,Calibration Names,T3872,Path Configuration,"
           "Calibration to Copy From,Verification Name\n"
           ",R1,\"Port 1,R1/A,\"\"RCVR R1 IN\"\"\",Path R1,None,R1 Check\n"
           ",a,\"Port 1,A/R1,\"\"RCVR A IN\"\"\",Path A,None,x\n"
           ",B,\"Port 2,B/R2,\"\"RCVR B IN\"\",Sweep B\",Path B,A,x\n"
           ",C,0,Path C,None,x\n"
           "Subs / Calibration,Sub Names,IFBW,NumPoints,Tolerance,Rec-R1,Rec-A,Rec-B\n"
           ",Sweep,1000,201,0.05,1,\"3,7\",0\n"
           ",Check,500,11,0.1,2,5,\n"
           "Preset Powers,Calibration Names,T3872\n"
           ",R1,-10.5\n"
           ",A,NA\n"
           ",B,-5\n"
           "Banded,BandNum,Start_freq,Stop_freq,Points,PowerLimit\n"
           ",2,1000000000,2000000000,11,5\n"
           ",3,2100000000,3000000000,10,0\n"
           ",4,3100000000,4000000000,10,-3\n"
           "Power Range / Sensor,Sensor Names,Max Power,Min Power\n"
           ",S1,20,-60\n"
           "Order / Power,Selection,T3872\n"
           ",Test Power,\"-20,4\"\n"
           ",Cal Order,\"R1,&A&,B\"\n"
           ",Minband,3\n"
           "\n";
}

// Replaces the first occurrence of what in text; the text must hold it.
inline std::string replaced(std::string text, const std::string& what, const std::string& with) {
    auto at = text.find(what);
    if (at == std::string::npos) {
        throw std::string("test text lacks: ") + what;
    }
    return text.replace(at, what.size(), with);
}

// The positions of a calibration's sub-steps, in their order.
inline std::vector<int> positions(const CCalibration& calibration) {
    std::vector<int> out;
    for (const auto& s : calibration.GetSubs()) {
        out.push_back(s.GetPosition());
    }
    return out;
}

}  // namespace configtest
