#pragma once

// The terminal's two streams, shared by the UI thread (notices) and the worker (its boxes);
// whole lines never interleave.

#include <mutex>
#include <ostream>
#include <string>

namespace console {

class ConsoleOutput {
  public:
    ConsoleOutput(std::ostream& out, std::ostream& err) : m_out(out), m_err(err) {}

    // Writes text as it is (no line end added), flushed.
    void write(const std::string& text);
    void error(const std::string& text);

  private:
    std::mutex m_mutex;
    std::ostream& m_out;
    std::ostream& m_err;
};

}  // namespace console
