#include "platform/NumberText.h"

#include <array>
#include <bit>
#include <charconv>
#include <climits>
#include <cmath>
#include <cstdint>
#include <cstdlib>

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

namespace {

using Wide = unsigned __int128;

constexpr std::array<Wide, 31> kPowersOfTen = [] {
    std::array<Wide, 31> powers{};
    Wide power = 1;
    for (auto& entry : powers) {
        entry = power;
        power *= 10;
    }
    return powers;
}();

Wide powerOfTen(int n) {
    return kPowersOfTen[static_cast<std::size_t>(n)];
}

// Rounds num / den to the nearest integer, ties to even, as printf rounds the exact value.
Wide roundedQuotient(Wide num, Wide den) {
    Wide q = num / den;
    const Wide twice = (num % den) * 2;
    if (twice > den || (twice == den && (q & 1) != 0)) {
        ++q;
    }
    return q;
}

// |value| = m * 2^e scaled to 8 significant digits: round(|value| * 10^(7 - exponent)).
// Returns false where the 128-bit arithmetic would not be exact.
bool eightDigits(std::uint32_t m, int e, int exponent, std::uint64_t& digits) {
    const int p = 7 - exponent;
    Wide q;
    if (p >= 0) {
        if (p > 30) {
            return false;
        }
        const Wide num = static_cast<Wide>(m) * powerOfTen(p);
        if (e >= 0) {
            if (e > 20) {
                return false;
            }
            q = num << e;
        } else {
            if (-e > 100) {
                return false;
            }
            // Division by a power of two: a shift, rounded half to even.
            const int k = -e;
            q = num >> k;
            const Wide rest = num - (q << k);
            const Wide half = static_cast<Wide>(1) << (k - 1);
            if (rest > half || (rest == half && (q & 1) != 0)) {
                ++q;
            }
        }
    } else {
        if (e < 0 || e > 60 || -p > 30) {
            return false;
        }
        q = roundedQuotient(static_cast<Wide>(m) << e, powerOfTen(-p));
    }
    digits = static_cast<std::uint64_t>(q);
    return q < static_cast<Wide>(1000000000);
}

}  // namespace

void appendFloat8(std::string& out, float value) {
    if (!std::isfinite(value) || value == 0) {
        appendGeneral(out, value, 8);
        return;
    }
    // |value| = m * 2^e with m an integer of at most 24 bits.
    const auto bits = std::bit_cast<std::uint32_t>(value);
    const int biased = static_cast<int>((bits >> 23) & 0xFF);
    const std::uint32_t fraction = bits & 0x7FFFFF;
    const std::uint32_t m = biased == 0 ? fraction : (fraction | 0x800000);
    const int e = (biased == 0 ? 1 : biased) - 150;
    const int e2 = e + std::bit_width(m);
    // log10(2) ~ 0.30103: an estimate the loop below corrects by one when needed.
    int exponent = static_cast<int>(std::floor((e2 - 1) * 0.30102999566398));
    std::uint64_t digits = 0;
    bool settled = false;
    for (int attempt = 0; attempt < 3 && !settled; ++attempt) {
        if (!eightDigits(m, e, exponent, digits)) {
            appendGeneral(out, value, 8);
            return;
        }
        if (digits >= 100000000) {
            ++exponent;  // a carry to 10^8, or an estimate one too low
            settled = digits == 100000000;
            if (settled) {
                digits = 10000000;
            }
        } else if (digits < 10000000) {
            --exponent;
        } else {
            settled = true;
        }
    }
    if (!settled) {
        appendGeneral(out, value, 8);
        return;
    }
    char text[8];
    for (int i = 7; i >= 0; --i) {  // digits of an 8-digit integer
        text[i] = static_cast<char>('0' + digits % 10);
        digits /= 10;
    }
    int count = 8;
    while (count > 1 && text[count - 1] == '0') {
        --count;
    }
    if (value < 0) {
        out += '-';
    }
    if (exponent < -4 || exponent >= 8) {
        out += text[0];
        if (count > 1) {
            out += '.';
            out.append(text + 1, count - 1);
        }
        out += exponent < 0 ? "e-" : "e+";
        const int magnitude = std::abs(exponent);
        if (magnitude < 10) {
            out += '0';
        }
        out += std::to_string(magnitude);
    } else if (exponent >= 0) {
        const int whole = exponent + 1;
        if (count <= whole) {
            out.append(text, count);
            out.append(static_cast<std::size_t>(whole - count), '0');
        } else {
            out.append(text, whole);
            out += '.';
            out.append(text + whole, count - whole);
        }
    } else {
        out += "0.";
        out.append(static_cast<std::size_t>(-exponent - 1), '0');
        out.append(text, count);
    }
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
