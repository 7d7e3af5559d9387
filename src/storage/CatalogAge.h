#pragma once

// How old a stored characterization is, from the month/day/year date of a catalog line or a
// directory listing (such as 12/4/2026), measured in local wall-clock time.

#include <chrono>
#include <string_view>

namespace storage {

// kCatalogRecent when the date's noon lies at most 7 whole days before now (or in the future),
// kCatalogOld when more; kCatalogNothing when the age cannot be told: day 0, a first number
// above 12, or no valid calendar date.
int catalogAge(std::string_view dateText, std::chrono::system_clock::time_point now);

}  // namespace storage
