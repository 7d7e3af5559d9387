#pragma once

// The instrument's IEEE 488.2 error queue: first in, first out, bounded; when it is full
// the newest entry becomes -350,"Queue overflow".

#include <cstddef>
#include <deque>
#include <string>

namespace scpi {

class ErrorQueue {
  public:
    static constexpr std::size_t capacity = 100;

    void push(int code, const std::string& message);
    // An entry already in the analyzer's form code,"message".
    void pushText(const std::string& entry);
    // The oldest entry, or 0,"No error" when empty.
    std::string pop();
    // Every entry, oldest first, joined by commas (SYST:ERR:ALL?); 0,"No error" when empty.
    std::string popAll();
    void clear() { m_entries.clear(); }
    std::size_t size() const { return m_entries.size(); }
    bool empty() const { return m_entries.empty(); }

  private:
    std::deque<std::string> m_entries;
};

}  // namespace scpi
