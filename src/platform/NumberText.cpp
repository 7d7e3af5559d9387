#include "platform/NumberText.h"

#include <array>
#include <bit>
#include <charconv>
#include <climits>
#include <cmath>
#include <cstdint>
#include <cstdlib>
#include <cstring>

namespace platform {

void appendGeneral(std::string& out, double value, int significantDigits) {
    char buffer[64];
    auto result = std::to_chars(buffer, buffer + sizeof buffer, value, std::chars_format::general,
                                significantDigits);
    out.append(buffer, result.ptr);
}

std::string generalText(double value, int significantDigits) {
    std::string text;
    appendGeneral(text, value, significantDigits);
    return text;
}

char* writeGeneral(char* out, double value, int significantDigits) {
    // Whole numbers within the precision print as their digits alone: most frequencies.
    static constexpr std::array<double, 18> kLimits = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,
                                                       1e6,  1e7,  1e8,  1e9,  1e10, 1e11,
                                                       1e12, 1e13, 1e14, 1e15, 1e16, 1e17};
    const double magnitude = std::fabs(value);
    if (magnitude < kLimits[static_cast<std::size_t>(significantDigits)] &&
        magnitude == std::trunc(magnitude)) {
        *out = '-';
        out += std::signbit(value) ? 1 : 0;
        return std::to_chars(out, out + 24, static_cast<std::uint64_t>(magnitude)).ptr;
    }
    return std::to_chars(out, out + kNumberRoom, value, std::chars_format::general,
                         significantDigits)
        .ptr;
}

namespace {

using Wide = unsigned __int128;

constexpr int kMaxFivePower = 44;  // 5^44 * 2^24 < 2^128

constexpr std::array<Wide, kMaxFivePower + 1> kPowersOfFive = [] {
    std::array<Wide, kMaxFivePower + 1> powers{};
    Wide power = 1;
    for (auto& entry : powers) {
        entry = power;
        power *= 5;
    }
    return powers;
}();

constexpr std::array<char, 200> kDigitPairs = [] {
    std::array<char, 200> pairs{};
    for (int i = 0; i < 100; ++i) {
        pairs[static_cast<std::size_t>(2 * i)] = static_cast<char>('0' + i / 10);
        pairs[static_cast<std::size_t>(2 * i + 1)] = static_cast<char>('0' + i % 10);
    }
    return pairs;
}();

void writePair(char* out, std::uint32_t twoDigits) {
    std::memcpy(out, &kDigitPairs[2 * twoDigits], 2);
}

// The eight digits of 10^7 <= d < 10^8 as characters, the first in the lowest byte: d / 10^6
// in 32.32 fixed point yields two digits per multiplication by 100.
std::uint64_t eightDigitText(std::uint32_t d) {
    static_assert(std::endian::native == std::endian::little);
    std::uint64_t fixed = d * std::uint64_t{281474977} >> 16;
    std::uint64_t text = 0;
    const auto takePair = [&](int pair) {
        std::uint16_t twoDigits;
        std::memcpy(&twoDigits, &kDigitPairs[2 * (fixed >> 32)], 2);
        text |= std::uint64_t{twoDigits} << (16 * pair);
        fixed = (fixed & 0xFFFFFFFF) * 100;
    };
    takePair(0);
    takePair(1);
    takePair(2);
    takePair(3);
    return text;
}

// value / 2^k rounded to the nearest integer, ties to even, as printf rounds the exact value.
Wide shiftedRounded(Wide value, int k) {
    Wide q = value >> k;
    const Wide rest = value - (q << k);
    const Wide half = static_cast<Wide>(1) << (k - 1);
    if (rest > half || (rest == half && (q & 1) != 0)) {
        ++q;
    }
    return q;
}

Wide roundedQuotient(Wide num, Wide den) {
    Wide q = num / den;
    const Wide twice = (num % den) * 2;
    if (twice > den || (twice == den && (q & 1) != 0)) {
        ++q;
    }
    return q;
}

// 5^p for p <= 27 shifted up to fill 64 bits, with the shift: exact, and a single 64x64-bit
// multiply away from m * 5^p.
struct AlignedFivePower {
    std::uint64_t value;
    int shift;
};
constexpr int kMaxAlignedFivePower = 27;
constexpr std::array<AlignedFivePower, kMaxAlignedFivePower + 1> kAlignedFivePowers = [] {
    std::array<AlignedFivePower, kMaxAlignedFivePower + 1> powers{};
    std::uint64_t power = 1;
    for (auto& entry : powers) {
        const int shift = std::countl_zero(power);
        entry = {power << shift, shift};
        power *= 5;
    }
    return powers;
}();

// round(m * 2^e * 10^p) for 0 <= p <= 27 where the result keeps the product's top 30 bits;
// without branches on the data, which is what the bulk export spends its time on.
bool alignedDigits(std::uint32_t m, int e, int p, std::uint64_t& digits) {
    const AlignedFivePower& five = kAlignedFivePowers[static_cast<std::size_t>(p)];
    const Wide product = static_cast<Wide>(m) * five.value;
    const auto high = static_cast<std::uint64_t>(product >> 64);
    const auto low = static_cast<std::uint64_t>(product);
    const int k = five.shift - p - e;  // value * 10^p = product / 2^k
    if (k < 34 || k > 64) {
        return false;
    }
    std::uint64_t q = (high << (64 - k)) | ((low >> 1) >> (k - 1));
    const std::uint64_t half = (low >> (k - 1)) & 1;
    const std::uint64_t belowHalf = low & ((std::uint64_t{1} << (k - 1)) - 1);
    q += half & ((belowHalf != 0) | (q & 1));  // ties to even
    digits = q;
    return true;
}

// round(m * 2^e * 10^p), exact, with 10^p = 5^p * 2^p folded into the binary exponent.
// Returns false where 128 bits would not hold the work.
bool scaledDigits(std::uint32_t m, int e, int p, std::uint64_t& digits) {
    if (p >= 0 && p <= kMaxAlignedFivePower && alignedDigits(m, e, p, digits)) {
        return true;
    }
    Wide q;
    if (p >= 0) {
        if (p > kMaxFivePower) {
            return false;
        }
        const Wide num = static_cast<Wide>(m) * kPowersOfFive[static_cast<std::size_t>(p)];
        const int shift = e + p;
        if (shift >= 0) {
            if (shift > 40 || p > 20) {
                return false;
            }
            q = num << shift;
        } else {
            if (shift <= -128) {
                return false;
            }
            q = shiftedRounded(num, -shift);
        }
    } else {
        const int shift = e + p;
        if (shift < 0 || shift > 100 || -p > kMaxFivePower) {
            return false;
        }
        q = roundedQuotient(static_cast<Wide>(m) << shift,
                            kPowersOfFive[static_cast<std::size_t>(-p)]);
    }
    if (q > 1000000000) {
        return false;
    }
    digits = static_cast<std::uint64_t>(q);
    return true;
}

// The nearest doubles to 10^-45 .. 10^39, the decimal exponents a float can need.
constexpr int kLowestTenPower = -45;
constexpr std::array<double, 85> kTenPowers = {
    1e-45, 1e-44, 1e-43, 1e-42, 1e-41, 1e-40, 1e-39, 1e-38, 1e-37, 1e-36, 1e-35, 1e-34, 1e-33,
    1e-32, 1e-31, 1e-30, 1e-29, 1e-28, 1e-27, 1e-26, 1e-25, 1e-24, 1e-23, 1e-22, 1e-21, 1e-20,
    1e-19, 1e-18, 1e-17, 1e-16, 1e-15, 1e-14, 1e-13, 1e-12, 1e-11, 1e-10, 1e-9,  1e-8,  1e-7,
    1e-6,  1e-5,  1e-4,  1e-3,  1e-2,  1e-1,  1e0,   1e1,   1e2,   1e3,   1e4,   1e5,   1e6,
    1e7,   1e8,   1e9,   1e10,  1e11,  1e12,  1e13,  1e14,  1e15,  1e16,  1e17,  1e18,  1e19,
    1e20,  1e21,  1e22,  1e23,  1e24,  1e25,  1e26,  1e27,  1e28,  1e29,  1e30,  1e31,  1e32,
    1e33,  1e34,  1e35,  1e36,  1e37,  1e38,  1e39};

double tenToThe(int exponent) {
    return kTenPowers[static_cast<std::size_t>(exponent - kLowestTenPower)];
}

char* writeGeneralFloat8(char* out, float value) {
    return std::to_chars(out, out + kNumberRoom, static_cast<double>(value),
                         std::chars_format::general, 8)
        .ptr;
}

}  // namespace

char* writeFloat8(char* out, float value) {
    const auto bits = std::bit_cast<std::uint32_t>(value);
    const int biased = static_cast<int>((bits >> 23) & 0xFF);
    if (biased == 0xFF || (bits & 0x7FFFFFFF) == 0) {
        return writeGeneralFloat8(out, value);  // zeros, infinities, NaN
    }
    // |value| = m * 2^e with m an integer of at most 24 bits.
    const std::uint32_t fraction = bits & 0x7FFFFF;
    const std::uint32_t m = biased == 0 ? fraction : (fraction | 0x800000);
    const int e = (biased == 0 ? 1 : biased) - 150;
    // 2^(e2 - 1) <= |value| < 2^e2 puts the decimal exponent at floor(log10(2^(e2 - 1))) or one
    // more; a comparison with the nearest double to the power of ten picks which. Exactness
    // comes from the digits: a wrong pick shows as digits outside [10^7, 10^8] and is redone.
    const int e2 = e + std::bit_width(m);
    int exponent = ((e2 - 1) * 78913) >> 18;
    if (std::fabs(static_cast<double>(value)) >= tenToThe(exponent + 1)) {
        ++exponent;
    }
    std::uint64_t digits = 0;
    const int p = 7 - exponent;
    const bool aligned = p >= 0 && p <= kMaxAlignedFivePower && alignedDigits(m, e, p, digits);
    if (!aligned && !scaledDigits(m, e, p, digits)) {
        return writeGeneralFloat8(out, value);
    }
    if (digits > 100000000 || digits < 10000000) {
        exponent += digits < 10000000 ? -1 : 1;
        if (!scaledDigits(m, e, 7 - exponent, digits) || digits < 10000000 || digits > 100000000) {
            return writeGeneralFloat8(out, value);
        }
    }
    if (digits == 100000000) {  // rounded up to the next power of ten
        ++exponent;
        digits = 10000000;
    }
    // Eight digit characters, then zeros for the fixed-width copies below to read.
    char text[16];
    const std::uint64_t digitText = eightDigitText(static_cast<std::uint32_t>(digits));
    std::memcpy(text, &digitText, 8);
    std::memcpy(text + 8, "00000000", 8);
    // Significant digits without the trailing zeros; the first digit is never 0.
    const int count = 8 - std::countl_zero(digitText ^ 0x3030303030303030u) / 8;
    *out = '-';
    out += value < 0 ? 1 : 0;
    if (exponent < -4 || exponent >= 8) {
        out[0] = text[0];
        out[1] = '.';
        std::memcpy(out + 2, text + 1, 8);
        out += count > 1 ? count + 1 : 1;
        out[0] = 'e';
        out[1] = exponent < 0 ? '-' : '+';
        writePair(out + 2, static_cast<std::uint32_t>(std::abs(exponent)));  // |exponent| < 46
        return out + 4;
    }
    if (exponent >= 0) {
        // The zeros past `count` are the integer part's own.
        const int whole = exponent + 1;
        std::memcpy(out, text, 8);
        out[whole] = '.';
        std::memcpy(out + whole + 1, text + whole, 8);
        return count > whole ? out + count + 1 : out + whole;
    }
    std::memcpy(out, "0.000", 5);
    out += 1 - exponent;
    std::memcpy(out, text, 8);
    return out + count;
}

void appendFloat8(std::string& out, float value) {
    char text[kNumberRoom];
    out.append(text, writeFloat8(text, value));
}

int leadingInteger(const std::string& text) {
    long value = std::strtol(text.c_str(), nullptr, 10);
    if (value > INT_MAX) {
        return INT_MAX;
    }
    if (value < INT_MIN) {
        return INT_MIN;
    }
    return static_cast<int>(value);
}

double leadingDouble(const std::string& text) {
    return std::strtod(text.c_str(), nullptr);
}

}  // namespace platform
