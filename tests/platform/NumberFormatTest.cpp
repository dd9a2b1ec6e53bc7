// The number formatter against a slow reference built on the C library's
// correctly rounded "%.5e": the same text for edge values and for a seeded
// sweep of random floats and doubles. ORVXML_NUMBER_SWEEP=<millions> widens
// the sweep.
#include <gtest/gtest.h>

#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <limits>
#include <random>
#include <string>
#include <vector>

#include "platform/NumberFormat.h"

namespace {

// ---- the reference: six digits from printf (ties to even), then exact
// ties moved away from zero by an exact test on the binary value.

bool isTieRoundedDown(double value, long long digits, int n) {
    int e2 = 0;
    const double f = std::frexp(std::fabs(value), &e2);
    unsigned long long m = static_cast<unsigned long long>(std::ldexp(f, 53));
    int e = e2 - 53;
    while ((m & 1u) == 0) {
        m >>= 1;
        ++e;
    }
    // value = m * 2^e with m odd; the target 2*digits + 1 is odd, so the
    // powers of two must cancel: e + n + 1 == 0.
    if (e + n + 1 != 0) return false;
    unsigned __int128 lhs = m, rhs = static_cast<unsigned __int128>(2 * digits + 1);
    if (n >= 0) {
        if (n > 9) return false;
        for (int i = 0; i < n; ++i) lhs *= 5;
    } else {
        if (-n > 22) return false;
        for (int i = 0; i < -n; ++i) rhs *= 5;
    }
    return lhs == rhs;
}

std::string reference(double value) {
    if (std::isnan(value)) return std::signbit(value) ? "-1.#IND" : "1.#QNAN";
    if (std::isinf(value)) return value < 0 ? "-1.#INF" : "1.#INF";
    if (value == 0) return std::signbit(value) ? "-0" : "0";
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
    std::snprintf(d, sizeof d, "%06lld", digits);
    int last = 5;
    while (last > 0 && d[last] == '0') --last;
    std::string out = negative ? "-" : "";
    if (exponent < -4 || exponent >= 6) {
        out += d[0];
        if (last > 0) out += "." + std::string(d + 1, d + last + 1);
        char e[16];
        std::snprintf(e, sizeof e, "e%c%03d", exponent < 0 ? '-' : '+', std::abs(exponent));
        out += e;
    } else if (exponent >= 0) {
        out += std::string(d, d + exponent + 1);
        if (last > exponent) out += "." + std::string(d + exponent + 1, d + last + 1);
    } else {
        out += "0." + std::string(static_cast<std::size_t>(-exponent - 1), '0') +
               std::string(d, d + last + 1);
    }
    return out;
}

std::string formatted(double value) {
    char16_t text[platform::kMaxFloatText];
    const std::size_t n = platform::formatFloat(text, value);
    EXPECT_LE(n, platform::kMaxFloatText);
    return std::string(text, text + n);
}

template <class To, class From>
To fromBits(From bits) {
    static_assert(sizeof(To) == sizeof(From), "same width");
    To v;
    std::memcpy(&v, &bits, sizeof v);
    return v;
}

// Counts and names the first few values where the two texts differ.
class Comparison {
public:
    void check(double value) {
        ++checked_;
        const std::string want = reference(value), got = formatted(value);
        if (want == got) return;
        if (++failures_ <= 10) {
            char bits[40];
            std::snprintf(bits, sizeof bits, "%a", value);
            ADD_FAILURE() << bits << ": reference " << want << ", formatter " << got;
        }
    }
    // The value, its neighbours and its negation.
    void checkAround(double value) {
        for (double v : {value, std::nextafter(value, 0.0), std::nextafter(value, HUGE_VAL)}) {
            check(v);
            check(-v);
        }
        const float f = static_cast<float>(value);
        for (float v : {f, std::nextafter(f, 0.0f), std::nextafter(f, HUGE_VALF)}) check(v);
    }
    std::size_t checked() const { return checked_; }

private:
    std::size_t checked_ = 0, failures_ = 0;
};

std::size_t sweepSize() {
    const char* millions = std::getenv("ORVXML_NUMBER_SWEEP");
    return millions ? static_cast<std::size_t>(std::atof(millions) * 1e6) : 1000000;
}

TEST(NumberFormatReference, EdgeValues) {
    Comparison c;
    const double lim[] = {std::numeric_limits<double>::min(),       std::numeric_limits<double>::max(),
                          std::numeric_limits<double>::denorm_min(), std::numeric_limits<float>::min(),
                          std::numeric_limits<float>::max(),        std::numeric_limits<float>::denorm_min(),
                          0.0, 1.0, 0.5, 0.1, 1.0 / 3, 2.0 / 3};
    for (double v : lim) c.checkAround(v);
    using D = std::numeric_limits<double>;
    for (double v : {D::infinity(), -D::infinity(), D::quiet_NaN(), -D::quiet_NaN(), D::signaling_NaN()}) c.check(v);
    // Powers of ten and the six-digit boundaries around each, where the
    // exponent changes and rounding carries.
    for (int e = -330; e <= 310; ++e) {
        const double p = std::pow(10.0, e);
        for (double f : {1.0, 9.999995, 9.99999, 9.999994999, 1.000005, 1.0000005, 5.0, 2.5})
            c.checkAround(p * f);
    }
    // Powers of two.
    for (int e = -1074; e <= 1023; ++e) c.checkAround(std::ldexp(1.0, e));
    // Exact ties of six digits: (2d + 1) / 2 * 10^(exponent - 5) where that
    // is a binary fraction, below one (5^n divides 2d + 1) and above.
    std::mt19937_64 rng(7);
    for (int n = 1; n <= 9; ++n) {
        long long five = 1;
        for (int i = 0; i < n; ++i) five *= 5;
        for (long long odd = five; odd < 2000000; odd += 2 * five) {
            if (odd < 200001 || rng() % 4 != 0) continue;
            c.checkAround(static_cast<double>(odd) / std::ldexp(std::pow(10.0, n), 1));
        }
    }
    for (int j = 0; j <= 22; ++j) {
        for (int i = 0; i < 2000; ++i) {
            const long long odd = 200001 + 2 * static_cast<long long>(rng() % 900000);
            c.checkAround(static_cast<double>(odd) * std::pow(5.0, j) * std::ldexp(1.0, j - 1));
        }
    }
    // The kinds of values the model holds: short decimals as floats.
    for (int i = -20000; i <= 20000; ++i) {
        c.check(static_cast<float>(i / 1000.0));
        c.check(static_cast<float>(i / 7.0));
        c.check(i * 0.25f);
    }
    EXPECT_GT(c.checked(), 500000u);
}

// Random bit patterns, then values of ordinary size, uniform in their exponent.
template <class Real, class Bits, class Rng>
void randomSweep(Rng rng, int minExponent, int maxExponent) {
    Comparison c;
    const std::size_t n = sweepSize();
    for (std::size_t i = 0; i < n; ++i) c.check(fromBits<Real>(static_cast<Bits>(rng())));
    std::uniform_real_distribution<Real> unit(1, 2);
    std::uniform_int_distribution<int> exponent(minExponent, maxExponent);
    for (std::size_t i = 0; i < n; ++i) c.check(std::ldexp(unit(rng), exponent(rng)));
}

TEST(NumberFormatReference, RandomFloats) { randomSweep<float, std::uint32_t>(std::mt19937(20261124), -40, 40); }

TEST(NumberFormatReference, RandomDoubles) { randomSweep<double, std::uint64_t>(std::mt19937_64(1124), -100, 130); }

// Whole numbers, which take a road of their own below 10^6: every one up to
// past the bound, both signs, and powers of two around it.
TEST(NumberFormatReference, WholeNumbers) {
    Comparison c;
    for (int i = 0; i <= 1100000; ++i) {
        c.check(static_cast<double>(i));
        c.check(-static_cast<double>(i));
    }
    for (int k = 0; k <= 64; ++k) {
        for (double f : {1.0, 3.0, 0.75, 999999.0, 1000001.0}) c.check(std::ldexp(f, k));
    }
    EXPECT_GT(c.checked(), 2200000u);
}

TEST(NumberFormatReference, IntegersMatchPrintf) {
    std::mt19937_64 rng(5);
    std::vector<std::int64_t> values = {0, 1, -1, 9, 10, -10, std::numeric_limits<std::int64_t>::min(),
                                        std::numeric_limits<std::int64_t>::max(), 2147483647,
                                        -2147483648LL};
    for (int i = 0; i < 100000; ++i) values.push_back(static_cast<std::int64_t>(rng()) >> (rng() % 64));
    for (std::int64_t v : values) {
        char want[32];
        std::snprintf(want, sizeof want, "%lld", static_cast<long long>(v));
        char16_t text[platform::kMaxIntText];
        const std::size_t n = platform::formatInt(text, v);
        ASSERT_EQ(std::string(text, text + n), want);
    }
}

}  // namespace
