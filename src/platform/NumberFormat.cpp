#include "platform/NumberFormat.h"

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>

namespace platform {

namespace {

void appendAscii(std::u16string& out, const char* s) {
    while (*s) out.push_back(static_cast<char16_t>(*s++));
}

// True if |value| * 10^n is exactly digits + 1/2, that is, if rounding to the
// six digits `digits` was an exact tie that went toward zero.
bool isTieRoundedDown(double value, long long digits, int n) {
    int e2 = 0;
    const double f = std::frexp(std::fabs(value), &e2);
    unsigned long long m = static_cast<unsigned long long>(std::ldexp(f, 53));
    int e = e2 - 53;
    if (m == 0) return false;
    while ((m & 1u) == 0) {
        m >>= 1;
        ++e;
    }
    // value = m * 2^e with m odd; the target 2*digits + 1 is odd, so the
    // powers of two must cancel: e + n + 1 == 0.
    if (e + n + 1 != 0) return false;
    const unsigned __int128 target = static_cast<unsigned __int128>(2 * digits + 1);
    unsigned __int128 lhs = m, rhs = target;
    if (n >= 0) {
        if (n > 9) return false;  // m * 5^n would exceed any six-digit target
        for (int i = 0; i < n; ++i) lhs *= 5;
    } else {
        if (-n > 22) return false;  // (2 * digits + 1) * 5^-n would exceed 2^53
        for (int i = 0; i < -n; ++i) rhs *= 5;
    }
    return lhs == rhs;
}

}  // namespace

void appendFloat(std::u16string& out, double value) {
    if (std::isnan(value)) {
        // The original runtime's texts: an indeterminate value (the sign set)
        // and a quiet NaN.
        appendAscii(out, std::signbit(value) ? "-1.#IND" : "1.#QNAN");
        return;
    }
    if (std::isinf(value)) {
        appendAscii(out, value < 0 ? "-1.#INF" : "1.#INF");
        return;
    }
    if (value == 0) {
        appendAscii(out, std::signbit(value) ? "-0" : "0");
        return;
    }

    // Six significant digits, correctly rounded (ties to even), then ties
    // moved away from zero.
    char buf[40];
    std::snprintf(buf, sizeof buf, "%.5e", value);
    const char* p = buf;
    const bool negative = (*p == '-');
    if (negative) ++p;
    long long digits = p[0] - '0';
    for (int i = 2; i < 7; ++i) digits = digits * 10 + (p[i] - '0');
    int exponent = std::atoi(p + 8);
    if (isTieRoundedDown(value, digits, 5 - exponent)) {
        ++digits;
        if (digits == 1000000) {
            digits = 100000;
            ++exponent;
        }
    }

    char d[7];
    for (int i = 5; i >= 0; --i) {
        d[i] = static_cast<char>('0' + digits % 10);
        digits /= 10;
    }
    d[6] = 0;
    int last = 5;  // index of the last significant digit to keep
    while (last > 0 && d[last] == '0') --last;

    if (negative) out.push_back(u'-');
    if (exponent < -4 || exponent >= 6) {
        out.push_back(static_cast<char16_t>(d[0]));
        if (last > 0) {
            out.push_back(u'.');
            for (int i = 1; i <= last; ++i) out.push_back(static_cast<char16_t>(d[i]));
        }
        out.push_back(u'e');
        out.push_back(exponent < 0 ? u'-' : u'+');
        char e[16];
        std::snprintf(e, sizeof e, "%03d", exponent < 0 ? -exponent : exponent);
        appendAscii(out, e);
    } else if (exponent >= 0) {
        for (int i = 0; i <= exponent; ++i) out.push_back(static_cast<char16_t>(d[i]));
        if (last > exponent) {
            out.push_back(u'.');
            for (int i = exponent + 1; i <= last; ++i) out.push_back(static_cast<char16_t>(d[i]));
        }
    } else {
        out.push_back(u'0');
        out.push_back(u'.');
        for (int i = 0; i < -exponent - 1; ++i) out.push_back(u'0');
        for (int i = 0; i <= last; ++i) out.push_back(static_cast<char16_t>(d[i]));
    }
}

void appendInt(std::u16string& out, std::int64_t value) {
    char buf[24];
    std::snprintf(buf, sizeof buf, "%lld", static_cast<long long>(value));
    appendAscii(out, buf);
}

}  // namespace platform
