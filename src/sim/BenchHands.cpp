#include "sim/BenchHands.h"

#include <charconv>

#include "scpi/ProgramMessage.h"

namespace sim {
namespace {

class LocalHands final : public BenchHands {
  public:
    explicit LocalHands(Instrument& instrument) : m_instrument(instrument) {}
    void cable(const std::vector<Instrument::Cable>& cables) override {
        m_instrument.cableReceivers(cables);
    }
    void recheckConnection(const std::string& receiver) override {
        m_instrument.operatorRecheckedConnection(receiver);
    }
    void recheckPad(const std::string& receiver) override {
        m_instrument.operatorRecheckedPad(receiver);
    }
    void reseatConnector(const std::string& receiver) override {
        m_instrument.operatorSawBadData(receiver);
    }

  private:
    Instrument& m_instrument;
};

class LinkHands final : public BenchHands {
  public:
    explicit LinkHands(std::function<void(const std::string&)> send) : m_send(std::move(send)) {}
    void cable(const std::vector<Instrument::Cable>& cables) override {
        std::string command = "SIM:BENCH:CABL";
        char number[32];
        for (std::size_t i = 0; i < cables.size(); ++i) {
            command += i == 0 ? " " : ",";
            command +=
                scpi::quotedString(cables[i].receiver) + "," + std::to_string(cables[i].port) + ",";
            command.append(number,
                           std::to_chars(number, number + sizeof number, cables[i].padDb).ptr);
        }
        m_send(command);
    }
    void recheckConnection(const std::string& receiver) override {
        m_send("SIM:BENCH:RECH:CONN " + scpi::quotedString(receiver));
    }
    void recheckPad(const std::string& receiver) override {
        m_send("SIM:BENCH:RECH:PAD " + scpi::quotedString(receiver));
    }
    void reseatConnector(const std::string& receiver) override {
        m_send("SIM:BENCH:RES " + scpi::quotedString(receiver));
    }

  private:
    std::function<void(const std::string&)> m_send;
};

}  // namespace

std::unique_ptr<BenchHands> handsOn(Instrument& instrument) {
    return std::make_unique<LocalHands>(instrument);
}

std::unique_ptr<BenchHands> handsOverLink(std::function<void(const std::string&)> send) {
    return std::make_unique<LinkHands>(std::move(send));
}

}  // namespace sim
