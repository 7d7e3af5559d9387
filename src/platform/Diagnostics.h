#pragma once

// The analyzer's diagnostics library: objects that can be talked to register themselves.
// Nothing is ever asked of them; the registry only keeps the registration.

#include <cstddef>

namespace platform {

class iTalker {
  public:
    virtual ~iTalker();
};

class CDiagnostic {
  public:
    static void RegisterTalker(iTalker* talker);
    static void UnregisterTalker(iTalker* talker);
    static std::size_t TalkerCount();
};

}  // namespace platform
