#include "storage/ExportText.h"

#include <cmath>
#include <iomanip>

namespace storage {
namespace {

// The attenuator as a whole number of digits only; a value no whole number can hold gives 0.
long long attenuatorDigits(float attenuatorDb) {
    double rounded = std::round(std::fabs(static_cast<double>(attenuatorDb)));
    return std::isfinite(rounded) && rounded < 1e18 ? static_cast<long long>(rounded) : 0;
}

}  // namespace

bool writeExportText(std::ostream& out, const RcvrCharImage& image) {
    auto flags = out.flags();
    auto precision = out.precision();
    out.unsetf(std::ios::floatfield);
    out << std::setprecision(12) << image.formatWord() << '\n'
        << image.nameCharacters() << '\n'
        << "25\n"
        << image.narrowbandLoss() << '\n'
        << attenuatorDigits(image.attenuatorDb());
    bool complete = image.completeness() == ImageCompleteness::Complete;
    if (complete) {
        const std::size_t records = image.announcedRecords();
        const std::size_t levels = image.levelCount();
        for (std::size_t r = 0; r < records; ++r) {
            out << '\n' << std::setprecision(15) << image.frequency(r) << std::setprecision(8);
            for (std::size_t level = 0; level < levels; ++level) {
                auto p = image.point(r, level);
                out << ", (" << p.power << ',' << p.value << ',' << p.phase << ')';
            }
        }
    }
    out.flags(flags);
    out.precision(precision);
    return complete;
}

}  // namespace storage
