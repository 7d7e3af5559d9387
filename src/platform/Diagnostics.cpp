#include "platform/Diagnostics.h"

#include <algorithm>
#include <mutex>
#include <vector>

namespace platform {
namespace {

std::mutex g_mutex;
std::vector<iTalker*> g_talkers;

}  // namespace

iTalker::~iTalker() {
    CDiagnostic::UnregisterTalker(this);
}

void CDiagnostic::RegisterTalker(iTalker* talker) {
    std::lock_guard lock(g_mutex);
    g_talkers.push_back(talker);
}

void CDiagnostic::UnregisterTalker(iTalker* talker) {
    std::lock_guard lock(g_mutex);
    std::erase(g_talkers, talker);
}

std::size_t CDiagnostic::TalkerCount() {
    std::lock_guard lock(g_mutex);
    return g_talkers.size();
}

}  // namespace platform
