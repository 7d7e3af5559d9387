#pragma once

// The LAN back end's link to an instrument, a raw SCPI socket or VXI-11 as the resource
// string says. After a failure or an abandoned reply the link recovers before the next
// message: a raw socket reconnects (it has no device clear); VXI-11 clears the device and
// makes a new link only when the clear fails.

#include <chrono>
#include <memory>

#include "analyzer/remote/ResourceString.h"
#include "analyzer/remote/Transport.h"

namespace remote {

std::unique_ptr<Transport> makeLanTransport(const ResourceString& resource,
                                            std::chrono::milliseconds timeout);

}  // namespace remote
