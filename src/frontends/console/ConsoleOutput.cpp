#include "frontends/console/ConsoleOutput.h"

namespace console {

void ConsoleOutput::write(const std::string& text) {
    std::lock_guard lock(m_mutex);
    m_out << text << std::flush;
}

void ConsoleOutput::error(const std::string& text) {
    std::lock_guard lock(m_mutex);
    m_out << std::flush;
    m_err << text << std::flush;
}

}  // namespace console
