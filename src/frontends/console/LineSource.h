#pragma once

// Operator input, read a line at a time without blocking the UI loop for long.

#include <chrono>
#include <optional>
#include <string>

namespace console {

class LineSource {
  public:
    virtual ~LineSource() = default;
    // A complete line when one is ready within timeout; nothing otherwise. ended() turns
    // true once the input has ended and every line has been taken.
    virtual std::optional<std::string> poll(std::chrono::milliseconds timeout) = 0;
    virtual bool ended() const = 0;
};

// Reads a file descriptor (the terminal) with poll(2).
class FdLineSource final : public LineSource {
  public:
    explicit FdLineSource(int fd) : m_fd(fd) {}
    std::optional<std::string> poll(std::chrono::milliseconds timeout) override;
    bool ended() const override { return m_eof && m_buffer.empty(); }

  private:
    std::optional<std::string> takeLine();

    int m_fd;
    bool m_eof = false;
    std::string m_buffer;
};

}  // namespace console
