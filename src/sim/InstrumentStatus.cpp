// IEEE 488.2 common commands, the error queue and presets.

#include "sim/CommandText.h"
#include "sim/Instrument.h"

namespace sim {

void Instrument::addCommonCommands() {
    auto& t = m_commands;
    using C = scpi::CommandContext;
    constexpr auto forever = std::chrono::milliseconds::max();
    auto none = [](auto&& f) {
        return [f](C& c) {
            f(c);
            return std::string();
        };
    };

    t.add("*IDN?", [this](C&) { return m_scenario.idn; });
    t.add("*OPT?", [this](C&) { return inQuotes(m_scenario.options); });
    t.add("*RST", none([this](C&) { preset(); }));
    t.add("*TST?", [](C&) { return std::string("0"); });
    t.add("*CLS", none([this](C&) {
              m_errors.clear();
              m_status.clear();
          }));
    t.add("*ESE", none([this](C& c) { m_status.setEventStatusEnable(c.parameters.number()); }));
    t.add("*ESE?", [this](C&) { return std::to_string(m_status.eventStatusEnable()); });
    t.add("*ESR?", [this](C&) { return std::to_string(m_status.readEventStatus()); });
    t.add("*SRE", none([this](C& c) { m_status.setServiceRequestEnable(c.parameters.number()); }));
    t.add("*SRE?", [this](C&) { return std::to_string(m_status.serviceRequestEnable()); });
    t.add("*STB?",
          [this](C&) { return std::to_string(m_status.statusByte(!m_errors.empty(), false)); });
    // Operations end when the sweep in progress is done.
    t.add("*OPC", none([this, forever](C&) {
              waitForSweep(forever);
              m_status.operationComplete();
          }));
    t.add("*OPC?", [this, forever](C&) {
        waitForSweep(forever);
        return std::string("1");
    });
    t.add("*WAI", none([this, forever](C&) { waitForSweep(forever); }));

    t.add("SYSTem:ERRor:[NEXT]?", [this](C&) { return m_errors.pop(); });
    t.add("SYSTem:ERRor:COUNt?", [this](C&) { return std::to_string(m_errors.size()); });
    t.add("SYSTem:ERRor:ALL?", [this](C&) { return m_errors.popAll(); });
    t.add("SYSTem:PRESet", none([this](C&) { preset(); }));
    t.add("SYSTem:FPReset", none([this](C&) { preset(); }));
}

}  // namespace sim
