#pragma once

// Where a file that could not be written whole is reported. The earlier file is then still as
// it was; what the analyzer stored is unaffected, so the step goes on after the report.

#include <string>

namespace storage {

class FileFailures {
  public:
    virtual ~FileFailures() = default;
    // text names the file and the reason.
    virtual void report(const std::string& text) = 0;
};

}  // namespace storage
