#pragma once

#include <string>

// One cell of a CSV file: its text exactly as read (no trimming, no change of case).
class CCell {
  public:
    explicit CCell(std::string text) : m_text(std::move(text)) {}
    virtual ~CCell() = default;

    const std::string& GetText() const { return m_text; }

  private:
    std::string m_text;
};
