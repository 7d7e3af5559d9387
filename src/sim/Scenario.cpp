#include "sim/Scenario.h"

#include <fstream>
#include <limits>
#include <nlohmann/json.hpp>
#include <set>
#include <sstream>

namespace sim {
namespace {

using nlohmann::json;

std::string typeName(const json& value) {
    if (value.is_number_integer() || value.is_number_unsigned()) {
        return "an integer";
    }
    if (value.is_number_float()) {
        return "a number";
    }
    if (value.is_string()) {
        return "a string";
    }
    if (value.is_boolean()) {
        return "a boolean";
    }
    if (value.is_array()) {
        return "an array";
    }
    if (value.is_object()) {
        return "an object";
    }
    return "null";
}

[[noreturn]] void fail(const std::string& what) {
    throw std::string("scenario: " + what);
}

void expectObject(const json& value, const std::string& key) {
    if (!value.is_object()) {
        fail("\"" + key + "\" must be an object, not " + typeName(value));
    }
}

std::string readString(const json& value, const std::string& key) {
    if (!value.is_string()) {
        fail("\"" + key + "\" must be a string, not " + typeName(value));
    }
    return value.get<std::string>();
}

double readNumber(const json& value, const std::string& key) {
    if (!value.is_number()) {
        fail("\"" + key + "\" must be a number, not " + typeName(value));
    }
    return value.get<double>();
}

long readInteger(const json& value, const std::string& key) {
    if (!value.is_number_integer() && !value.is_number_unsigned()) {
        fail("\"" + key + "\" must be an integer, not " + typeName(value));
    }
    return value.get<long>();
}

void rejectUnknownKeys(const json& object, const std::set<std::string>& known,
                       const std::string& where) {
    for (const auto& item : object.items()) {
        if (!known.count(item.key())) {
            fail("unknown key \"" + item.key() + "\"" + (where.empty() ? "" : " in " + where));
        }
    }
}

void checkReceiver(const Scenario& scenario, const std::string& name, const std::string& key) {
    if (!scenario.hasReceiver(name)) {
        fail("\"" + key + "\" names receiver \"" + name + "\", which a " +
             std::to_string(scenario.portCount) + "-port analyzer does not have");
    }
}

void readReceiverOverrides(const json& value, const std::string& key, ReceiverParameters& p) {
    expectObject(value, key);
    rejectUnknownKeys(value,
                      {"psat_dbm", "psat_slope_db_per_ghz", "psat_ripple_db",
                       "psat_ripple_period_ghz", "smoothness", "am_pm_deg_per_db", "noise_db"},
                      key);
    if (value.contains("psat_dbm")) {
        p.psatDbm = readNumber(value["psat_dbm"], key + ".psat_dbm");
    }
    if (value.contains("psat_slope_db_per_ghz")) {
        p.psatSlopeDbPerGhz =
            readNumber(value["psat_slope_db_per_ghz"], key + ".psat_slope_db_per_ghz");
    }
    if (value.contains("psat_ripple_db")) {
        p.psatRippleDb = readNumber(value["psat_ripple_db"], key + ".psat_ripple_db");
    }
    if (value.contains("psat_ripple_period_ghz")) {
        p.psatRipplePeriodGhz =
            readNumber(value["psat_ripple_period_ghz"], key + ".psat_ripple_period_ghz");
    }
    // Checked on the merged values: "*" may set the ripple and a receiver the period.
    if ((value.contains("psat_ripple_db") || value.contains("psat_ripple_period_ghz")) &&
        p.psatRippleDb != 0.0 && p.psatRipplePeriodGhz <= 0.0) {
        fail("\"" + key +
             ".psat_ripple_period_ghz\" must be greater than 0 while \"psat_ripple_db\" is not 0");
    }
    if (value.contains("smoothness")) {
        p.smoothness = readNumber(value["smoothness"], key + ".smoothness");
        if (p.smoothness <= 0.0) {
            fail("\"" + key + ".smoothness\" must be greater than 0");
        }
    }
    if (value.contains("am_pm_deg_per_db")) {
        p.amPmDegPerDb = readNumber(value["am_pm_deg_per_db"], key + ".am_pm_deg_per_db");
    }
    if (value.contains("noise_db")) {
        p.noiseDb = readNumber(value["noise_db"], key + ".noise_db");
        if (p.noiseDb < 0.0) {
            fail("\"" + key + ".noise_db\" must not be negative");
        }
    }
}

template <class T, class Reader>
std::map<std::string, T> readReceiverMap(const Scenario& scenario, const json& value,
                                         const std::string& key, Reader reader) {
    expectObject(value, key);
    std::map<std::string, T> result;
    for (const auto& item : value.items()) {
        std::string itemKey = key + "." + item.key();
        checkReceiver(scenario, item.key(), itemKey);
        result[item.key()] = reader(item.value(), itemKey);
    }
    return result;
}

int readCount(const json& value, const std::string& key) {
    const long n = readInteger(value, key);
    if (n < 0 || n > std::numeric_limits<int>::max()) {
        fail("\"" + key + "\" must be a count from 0 to " +
             std::to_string(std::numeric_limits<int>::max()) + ", not " + std::to_string(n));
    }
    return static_cast<int>(n);
}

// A number of commands, or {"commands": N, "times": T}.
LinkCount readLinkCount(const json& value, const std::string& key) {
    LinkCount parsed;
    if (value.is_object()) {
        rejectUnknownKeys(value, {"commands", "times"}, key);
        if (!value.contains("commands")) {
            fail("\"" + key + "\" needs \"commands\"");
        }
        parsed.commands = readInteger(value["commands"], key + ".commands");
        if (value.contains("times")) {
            parsed.times = readCount(value["times"], key + ".times");
        }
    } else if (value.is_number_integer() || value.is_number_unsigned()) {
        parsed.commands = readInteger(value, key);
    } else {
        fail("\"" + key + "\" must be an integer or an object, not " + typeName(value));
    }
    if (parsed.commands < 1) {
        fail("\"" + key + "\" must count at least 1 command");
    }
    return parsed;
}

// One {"command": PREFIX, "times": T} or an array of them.
std::vector<LinkRule> readLinkRules(const json& value, const std::string& key) {
    const bool single = value.is_object();
    if (!single && !value.is_array()) {
        fail("\"" + key + "\" must be an object or an array, not " + typeName(value));
    }
    std::vector<LinkRule> rules;
    for (std::size_t i = 0; i < (single ? 1 : value.size()); ++i) {
        const json& rule = single ? value : value[i];
        const std::string itemKey = single ? key : key + "[" + std::to_string(i) + "]";
        expectObject(rule, itemKey);
        rejectUnknownKeys(rule, {"command", "times"}, itemKey);
        if (!rule.contains("command")) {
            fail("\"" + itemKey + "\" needs \"command\"");
        }
        LinkRule parsed;
        parsed.command = readString(rule["command"], itemKey + ".command");
        if (parsed.command.find_first_not_of(" \t") == std::string::npos) {
            fail("\"" + itemKey + ".command\" must not be empty");
        }
        if (rule.contains("times")) {
            parsed.times = readCount(rule["times"], itemKey + ".times");
        }
        rules.push_back(std::move(parsed));
    }
    return rules;
}

void readLinkFaults(LinkFaultRules& link, const json& value) {
    expectObject(value, "faults.link");
    rejectUnknownKeys(value,
                      {"drop_after_commands", "drop_mid_response_on", "stall_on", "garbage_on",
                       "split_reply_ms", "restart_after_commands"},
                      "faults.link");
    if (value.contains("drop_after_commands")) {
        link.dropAfterCommands =
            readLinkCount(value["drop_after_commands"], "faults.link.drop_after_commands");
    }
    if (value.contains("restart_after_commands")) {
        link.restartAfterCommands =
            readLinkCount(value["restart_after_commands"], "faults.link.restart_after_commands");
    }
    if (value.contains("drop_mid_response_on")) {
        link.dropMidResponseOn =
            readLinkRules(value["drop_mid_response_on"], "faults.link.drop_mid_response_on");
    }
    if (value.contains("stall_on")) {
        link.stallOn = readLinkRules(value["stall_on"], "faults.link.stall_on");
    }
    if (value.contains("garbage_on")) {
        link.garbageOn = readLinkRules(value["garbage_on"], "faults.link.garbage_on");
    }
    if (value.contains("split_reply_ms")) {
        link.splitReplyMs = readCount(value["split_reply_ms"], "faults.link.split_reply_ms");
        if (link.splitReplyMs > 60000) {
            fail("\"faults.link.split_reply_ms\" must be at most 60000, not " +
                 std::to_string(link.splitReplyMs));
        }
    }
}

void readFaults(Scenario& scenario, const json& value) {
    expectObject(value, "faults");
    rejectUnknownKeys(value,
                      {"disconnected", "wrong_pad_db", "narrowband_loss_db", "attenuator_reply",
                       "bad_data", "corrupt_flash_writes", "scpi_errors", "link"},
                      "faults");
    auto count = [](const json& v, const std::string& k) {
        long n = readInteger(v, k);
        if (n < 0) {
            fail("\"" + k + "\" must not be negative");
        }
        return static_cast<int>(n);
    };
    Faults& f = scenario.faults;
    if (value.contains("disconnected")) {
        f.disconnected =
            readReceiverMap<int>(scenario, value["disconnected"], "faults.disconnected", count);
    }
    if (value.contains("bad_data")) {
        f.badData = readReceiverMap<int>(scenario, value["bad_data"], "faults.bad_data", count);
    }
    if (value.contains("corrupt_flash_writes")) {
        f.corruptFlashWrites = readReceiverMap<int>(scenario, value["corrupt_flash_writes"],
                                                    "faults.corrupt_flash_writes", count);
    }
    if (value.contains("wrong_pad_db")) {
        f.wrongPadDb = readReceiverMap<double>(scenario, value["wrong_pad_db"],
                                               "faults.wrong_pad_db", readNumber);
    }
    if (value.contains("narrowband_loss_db")) {
        f.narrowbandLossDb = readReceiverMap<double>(scenario, value["narrowband_loss_db"],
                                                     "faults.narrowband_loss_db", readNumber);
    }
    if (value.contains("attenuator_reply")) {
        f.attenuatorReply = readReceiverMap<std::string>(scenario, value["attenuator_reply"],
                                                         "faults.attenuator_reply", readString);
    }
    if (value.contains("scpi_errors")) {
        const json& rules = value["scpi_errors"];
        if (!rules.is_array()) {
            fail("\"faults.scpi_errors\" must be an array, not " + typeName(rules));
        }
        for (std::size_t i = 0; i < rules.size(); ++i) {
            std::string key = "faults.scpi_errors[" + std::to_string(i) + "]";
            const json& rule = rules[i];
            expectObject(rule, key);
            rejectUnknownKeys(rule, {"command", "errors", "times"}, key);
            ScpiErrorRule parsed;
            if (!rule.contains("command") || !rule.contains("errors")) {
                fail("\"" + key + "\" needs \"command\" and \"errors\"");
            }
            parsed.command = readString(rule["command"], key + ".command");
            const json& errors = rule["errors"];
            if (!errors.is_array()) {
                fail("\"" + key + ".errors\" must be an array, not " + typeName(errors));
            }
            for (std::size_t e = 0; e < errors.size(); ++e) {
                std::string text =
                    readString(errors[e], key + ".errors[" + std::to_string(e) + "]");
                if (text.find(',') == std::string::npos) {
                    fail("\"" + key + ".errors[" + std::to_string(e) +
                         "]\" must read code,\"message\", not \"" + text + "\"");
                }
                parsed.errors.push_back(text);
            }
            if (rule.contains("times")) {
                parsed.times = count(rule["times"], key + ".times");
            }
            f.scpiErrors.push_back(parsed);
        }
    }
    if (value.contains("link")) {
        readLinkFaults(f.link, value["link"]);
    }
}

void readStored(Scenario& scenario, const json& value) {
    if (!value.is_array()) {
        fail("\"stored\" must be an array, not " + typeName(value));
    }
    for (std::size_t i = 0; i < value.size(); ++i) {
        std::string key = "stored[" + std::to_string(i) + "]";
        const json& entry = value[i];
        expectObject(entry, key);
        rejectUnknownKeys(entry, {"receiver", "age_days", "records", "words"}, key);
        StoredCalibration stored;
        if (!entry.contains("receiver")) {
            fail("\"" + key + "\" needs \"receiver\"");
        }
        stored.receiver = readString(entry["receiver"], key + ".receiver");
        checkReceiver(scenario, stored.receiver, key + ".receiver");
        if (entry.contains("age_days")) {
            stored.ageDays = readNumber(entry["age_days"], key + ".age_days");
        }
        if (entry.contains("records") == entry.contains("words")) {
            fail("\"" + key + "\" needs exactly one of \"records\" and \"words\"");
        }
        if (entry.contains("records")) {
            stored.records = readInteger(entry["records"], key + ".records");
            if (*stored.records < 0) {
                fail("\"" + key + ".records\" must not be negative");
            }
        } else {
            stored.words = readInteger(entry["words"], key + ".words");
            if (*stored.words < 0) {
                fail("\"" + key + ".words\" must not be negative");
            }
        }
        scenario.stored.push_back(stored);
    }
}

}  // namespace

ReceiverParameters defaultReceiverParameters(const std::string& receiver) {
    ReceiverParameters p;
    // Reference receivers are measured behind a 20 dB pad, so they compress 20 dB lower.
    p.psatDbm = (!receiver.empty() && receiver[0] == 'R') ? -20.0 : 0.0;
    return p;
}

Scenario::Scenario() {
    for (const auto& name : receiverNames()) {
        receivers[name] = defaultReceiverParameters(name);
    }
}

std::vector<std::string> Scenario::receiverNames() const {
    std::vector<std::string> names;
    for (int port = 1; port <= portCount; ++port) {
        names.push_back("R" + std::to_string(port));
    }
    for (int port = 1; port <= portCount; ++port) {
        names.push_back(std::string(1, static_cast<char>('A' + port - 1)));
    }
    return names;
}

bool Scenario::hasReceiver(const std::string& name) const {
    for (const auto& known : receiverNames()) {
        if (known == name) {
            return true;
        }
    }
    return false;
}

const ReceiverParameters& Scenario::receiver(const std::string& name) const {
    auto it = receivers.find(name);
    if (it == receivers.end()) {
        throw std::string("simulated analyzer has no receiver \"" + name + "\"");
    }
    return it->second;
}

Scenario Scenario::fromJson(const std::string& text) {
    json root;
    try {
        root = json::parse(text);
    } catch (const json::parse_error& e) {
        fail(std::string("invalid JSON: ") + e.what());
    }
    expectObject(root, "the scenario");
    rejectUnknownKeys(root,
                      {"idn", "options", "port_count", "mmwave_catalog", "mmwave_active", "app_dir",
                       "receivers", "stored", "faults"},
                      "");
    Scenario s;
    if (root.contains("port_count")) {
        long ports = readInteger(root["port_count"], "port_count");
        if (ports < 1 || ports > 4) {
            fail("\"port_count\" must be 1 to 4, not " + std::to_string(ports));
        }
        s.portCount = static_cast<int>(ports);
        s.receivers.clear();
        for (const auto& name : s.receiverNames()) {
            s.receivers[name] = defaultReceiverParameters(name);
        }
    }
    if (root.contains("idn")) {
        s.idn = readString(root["idn"], "idn");
        auto first = s.idn.find(',');
        if (first == std::string::npos || s.idn.find(',', first + 1) == std::string::npos) {
            fail("\"idn\" must read maker,model,serial,firmware, not \"" + s.idn + "\"");
        }
    }
    if (root.contains("options")) {
        s.options = readString(root["options"], "options");
        if (s.options.find('"') != std::string::npos) {
            fail("\"options\" must not contain a double quote");
        }
    }
    if (root.contains("mmwave_catalog")) {
        s.mmwaveCatalog = readString(root["mmwave_catalog"], "mmwave_catalog");
    }
    if (root.contains("mmwave_active")) {
        s.mmwaveActive = readString(root["mmwave_active"], "mmwave_active");
    }
    if (root.contains("app_dir")) {
        s.appDir = readString(root["app_dir"], "app_dir");
    }
    if (root.contains("receivers")) {
        const json& receivers = root["receivers"];
        expectObject(receivers, "receivers");
        // "*" first, so that named receivers override it field by field.
        if (receivers.contains("*")) {
            for (auto& [name, params] : s.receivers) {
                readReceiverOverrides(receivers["*"], "receivers.*", params);
            }
        }
        for (const auto& item : receivers.items()) {
            if (item.key() == "*") {
                continue;
            }
            checkReceiver(s, item.key(), "receivers." + item.key());
            readReceiverOverrides(item.value(), "receivers." + item.key(), s.receivers[item.key()]);
        }
    }
    if (root.contains("stored")) {
        readStored(s, root["stored"]);
    }
    if (root.contains("faults")) {
        readFaults(s, root["faults"]);
    }
    return s;
}

Scenario Scenario::fromFile(const std::filesystem::path& path) {
    std::ifstream in(path, std::ios::binary);
    if (!in) {
        fail("cannot read file " + path.string());
    }
    std::ostringstream text;
    text << in.rdbuf();
    try {
        return fromJson(text.str());
    } catch (const std::string& error) {
        throw std::string(error + " (" + path.string() + ")");
    }
}

}  // namespace sim
