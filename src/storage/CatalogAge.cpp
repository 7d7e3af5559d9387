#include "storage/CatalogAge.h"

#include <cmath>
#include <ctime>

#include "storage/CatalogFindings.h"

namespace storage {
namespace {

// The decimal number at the start of the text; no digits give 0.
unsigned leadingNumber(std::string_view text) {
    unsigned value = 0;
    for (char c : text) {
        if (c < '0' || c > '9' || value > 100000) {
            break;
        }
        value = value * 10 + static_cast<unsigned>(c - '0');
    }
    return value;
}

// Seconds of a local wall-clock date and time counted from 1970-01-01 00:00, ignoring the
// time zone's offset and daylight saving, so that differences are wall-clock differences.
long long wallSeconds(std::chrono::year_month_day date, long long secondsOfDay) {
    return static_cast<long long>(std::chrono::sys_days(date).time_since_epoch().count()) * 86400 +
           secondsOfDay;
}

}  // namespace

int catalogAge(std::string_view dateText, std::chrono::system_clock::time_point now) {
    using namespace std::chrono;
    auto firstSlash = dateText.find('/');
    if (firstSlash == std::string_view::npos) {
        return kCatalogNothing;
    }
    auto secondSlash = dateText.find('/', firstSlash + 1);
    if (secondSlash == std::string_view::npos) {
        return kCatalogNothing;
    }
    unsigned month = leadingNumber(dateText.substr(0, firstSlash));
    unsigned day = leadingNumber(dateText.substr(firstSlash + 1, 2));
    unsigned yearNumber = leadingNumber(dateText.substr(secondSlash + 1));
    year_month_day stored{year{static_cast<int>(yearNumber)}, std::chrono::month{month},
                          std::chrono::day{day}};
    if (day == 0 || !stored.ok()) {
        return kCatalogNothing;
    }

    auto whole = floor<seconds>(now);
    std::time_t t = system_clock::to_time_t(whole);
    std::tm local{};
    localtime_r(&t, &local);
    year_month_day today{year{local.tm_year + 1900},
                         std::chrono::month{static_cast<unsigned>(local.tm_mon + 1)},
                         std::chrono::day{static_cast<unsigned>(local.tm_mday)}};
    double nowSeconds = static_cast<double>(wallSeconds(
                            today, local.tm_hour * 3600LL + local.tm_min * 60LL + local.tm_sec)) +
                        duration<double>(now - whole).count();
    double difference = nowSeconds - static_cast<double>(wallSeconds(stored, 12 * 3600));
    long long wholeDays = std::llround(difference) / 86400;
    return wholeDays > 7 ? kCatalogOld : kCatalogRecent;
}

}  // namespace storage
