#include "frontends/qt/RunProgressWatcher.h"

namespace qtui {

namespace {

std::string withoutLineEnd(std::string text) {
    while (!text.empty() && (text.back() == '\n' || text.back() == '\r')) {
        text.pop_back();
    }
    return text;
}

}  // namespace

std::optional<std::string> RunProgressWatcher::onNotice(const std::string& text) {
    static const std::string kStarted = "Started Cal ";
    const std::string line = withoutLineEnd(text);
    if (line.rfind(kStarted, 0) == 0) {
        m_current = line.substr(kStarted.size());
        return std::nullopt;
    }
    if (line == "Cal Complete" && !m_current.empty()) {
        std::string done = m_current;
        m_current.clear();
        return done;
    }
    if (line == "Characterization Aborted" || line == "Error in Cal") {
        m_current.clear();
    }
    return std::nullopt;
}

}  // namespace qtui
