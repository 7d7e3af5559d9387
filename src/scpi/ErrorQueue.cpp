#include "scpi/ErrorQueue.h"

namespace scpi {

void ErrorQueue::push(int code, const std::string& message) {
    pushText(std::to_string(code) + ",\"" + message + "\"");
}

void ErrorQueue::pushText(const std::string& entry) {
    if (m_entries.size() < capacity - 1) {
        m_entries.push_back(entry);
    } else if (m_entries.size() == capacity - 1) {
        m_entries.push_back("-350,\"Queue overflow\"");
    }
}

std::string ErrorQueue::pop() {
    if (m_entries.empty()) {
        return "0,\"No error\"";
    }
    std::string entry = std::move(m_entries.front());
    m_entries.pop_front();
    return entry;
}

std::string ErrorQueue::popAll() {
    if (m_entries.empty()) {
        return pop();
    }
    std::size_t size = m_entries.size();
    for (const auto& entry : m_entries) {
        size += entry.size();
    }
    std::string all;
    all.reserve(size);
    for (const auto& entry : m_entries) {
        all += entry;
        all += ',';
    }
    all.pop_back();
    m_entries.clear();
    return all;
}

}  // namespace scpi
