#pragma once

// Stands in for creating the analyzer's Application object by class identifier on a host.
// Back ends register by name; the empty host name means the process's default back end.

#include <functional>
#include <memory>
#include <string>

#include "analyzer/automation/Automation.h"

namespace automation {

// Returns the created object, or nullptr when creation failed.
using BackendCreator = std::function<std::shared_ptr<Object>(const std::string& host)>;

class BackendFactory {
  public:
    static void registerBackend(const std::string& name, BackendCreator creator);
    static void unregisterBackend(const std::string& name);
    // Which registered back end the empty host name means.
    static void setDefaultBackend(const std::string& name);
    // Host "" is the default back end; any other host names a back end, optionally followed
    // by ":" and a back-end argument. nullptr when no such back end exists or it declines;
    // a back end that cannot start because of bad input raises its own error text.
    static std::shared_ptr<Object> create(const std::string& host);
};

}  // namespace automation
