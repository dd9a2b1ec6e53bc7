#include "platform/NumberFormat.h"

#include <cstring>

namespace platform {

namespace {

using u128 = unsigned __int128;

// Powers of five and ten that fit in 128 bits.
struct Powers {
    u128 five[56];  // 5^55 < 2^128
    u128 ten[39];   // 10^38 < 2^128
    constexpr Powers() : five(), ten() {
        five[0] = ten[0] = 1;
        for (int i = 1; i < 56; ++i) five[i] = five[i - 1] * 5;
        for (int i = 1; i < 39; ++i) ten[i] = ten[i - 1] * 10;
    }
};
constexpr Powers kPowers;

int bitLength(std::uint64_t x) { return x ? 64 - __builtin_clzll(x) : 0; }

int bitLength(u128 x) {
    const std::uint64_t high = static_cast<std::uint64_t>(x >> 64);
    return high ? 128 - __builtin_clzll(high) : bitLength(static_cast<std::uint64_t>(x));
}

// Any quotient at or above this says "the decimal exponent is too small".
constexpr std::uint64_t kTooLarge = 10000000;

// floor(m * 2^e * 10^k), and where the rest stands against one half:
// below (-1), exactly (0) or above (1).
struct Scaled {
    std::uint64_t quotient;
    int half;
};

std::uint64_t capped(u128 q) { return q >= kTooLarge ? kTooLarge : static_cast<std::uint64_t>(q); }

int compare(u128 a, u128 b) { return a < b ? -1 : a == b ? 0 : 1; }

// The scaling in 128-bit integers; false if a value would not fit. Covers
// every float and the doubles from about 1e-27 to 3e38.
bool scale128(std::uint64_t m, int e, int k, Scaled& r) {
    if (k >= 0) {
        if (k > 55) return false;
        const u128 p5 = kPowers.five[k];
        if (bitLength(m) + bitLength(p5) > 128) return false;
        const u128 num = p5 * m;  // m * 10^k = num * 2^k
        const int shift = e + k;
        if (shift >= 0) {
            r.quotient = bitLength(num) + shift > 100 ? kTooLarge : capped(num << shift);
            r.half = -1;
            return true;
        }
        const int t = -shift;
        if (t >= 128) {  // far below one; the exponent gets raised
            r.quotient = 0;
            r.half = -1;
            return true;
        }
        const u128 rest = num & ((u128(1) << t) - 1);
        r.quotient = capped(num >> t);
        r.half = compare(rest, u128(1) << (t - 1));
        return true;
    }
    if (-k > 38) return false;
    u128 num = m;
    u128 den = kPowers.ten[-k];
    if (e >= 0) {
        if (bitLength(m) + e > 128) return false;
        num <<= e;
    } else {
        if (bitLength(den) - e > 128) return false;
        den <<= -e;
    }
    const u128 q = num / den;
    const u128 rest = num - q * den;
    r.quotient = capped(q);
    r.half = compare(rest, den - rest);
    return true;
}

// A small unsigned big integer, enough for m * 5^330 and 2^1074.
class Big {
public:
    explicit Big(std::uint64_t v) : size_(0) {
        for (; v; v >>= 32) limbs_[size_++] = static_cast<std::uint32_t>(v);
    }

    void multiply(std::uint32_t factor) {
        std::uint64_t carry = 0;
        for (int i = 0; i < size_; ++i) {
            carry += static_cast<std::uint64_t>(limbs_[i]) * factor;
            limbs_[i] = static_cast<std::uint32_t>(carry);
            carry >>= 32;
        }
        if (carry) limbs_[size_++] = static_cast<std::uint32_t>(carry);
    }

    void multiplyPow5(int n) {
        for (; n >= 13; n -= 13) multiply(1220703125u);  // 5^13
        std::uint32_t rest = 1;
        for (; n > 0; --n) rest *= 5;
        multiply(rest);
    }

    void shiftLeft(int bits) {
        if (size_ == 0 || bits == 0) return;
        const int words = bits / 32, rest = bits % 32;
        std::uint32_t out[kLimbs + 1] = {};
        for (int i = 0; i < size_; ++i) {
            const std::uint64_t v = static_cast<std::uint64_t>(limbs_[i]) << rest;
            out[i + words] |= static_cast<std::uint32_t>(v);
            out[i + words + 1] = static_cast<std::uint32_t>(v >> 32);
        }
        size_ += words + 1;
        std::memcpy(limbs_, out, sizeof limbs_);
        trim();
    }

    // this -= other, where other <= this.
    void subtract(const Big& other) {
        std::int64_t borrow = 0;
        for (int i = 0; i < size_; ++i) {
            std::int64_t v = static_cast<std::int64_t>(limbs_[i]) - borrow -
                             (i < other.size_ ? other.limbs_[i] : 0);
            borrow = v < 0;
            limbs_[i] = static_cast<std::uint32_t>(v + (borrow << 32));
        }
        trim();
    }

    friend int compare(const Big& a, const Big& b) {
        if (a.size_ != b.size_) return a.size_ < b.size_ ? -1 : 1;
        for (int i = a.size_ - 1; i >= 0; --i)
            if (a.limbs_[i] != b.limbs_[i]) return a.limbs_[i] < b.limbs_[i] ? -1 : 1;
        return 0;
    }

private:
    static constexpr int kLimbs = 40;

    void trim() {
        while (size_ > 0 && limbs_[size_ - 1] == 0) --size_;
    }

    std::uint32_t limbs_[kLimbs + 1] = {};
    int size_;
};

// The same scaling for any double, by long division of big integers.
void scaleBig(std::uint64_t m, int e, int k, Scaled& r) {
    Big num(m), den(1);
    if (k >= 0)
        num.multiplyPow5(k);
    else
        den.multiplyPow5(-k);
    const int shift = e + k;
    if (shift >= 0)
        num.shiftLeft(shift);
    else
        den.shiftLeft(-shift);
    Big limit = den;
    limit.shiftLeft(31);
    if (compare(num, limit) >= 0) {
        r.quotient = kTooLarge;
        r.half = -1;
        return;
    }
    std::uint64_t q = 0;
    for (int bit = 30; bit >= 0; --bit) {
        Big part = den;
        part.shiftLeft(bit);
        if (compare(num, part) >= 0) {
            num.subtract(part);
            q |= std::uint64_t(1) << bit;
        }
    }
    num.shiftLeft(1);
    r.quotient = capped(q);
    r.half = compare(num, den);
}

std::size_t copyAscii(char16_t* out, const char* text) {
    std::size_t n = 0;
    for (; text[n]; ++n) out[n] = static_cast<char16_t>(text[n]);
    return n;
}

}  // namespace

std::size_t formatFloat(char16_t* out, double value) {
    std::uint64_t bits;
    std::memcpy(&bits, &value, sizeof bits);
    const bool negative = (bits >> 63) != 0;
    const int field = static_cast<int>((bits >> 52) & 0x7FF);
    std::uint64_t m = bits & ((std::uint64_t(1) << 52) - 1);
    if (field == 0x7FF) {
        // The original runtime's texts: infinities, an indeterminate value
        // (the sign set) and a quiet NaN.
        if (m == 0) return copyAscii(out, negative ? "-1.#INF" : "1.#INF");
        return copyAscii(out, negative ? "-1.#IND" : "1.#QNAN");
    }
    char16_t* p = out;
    if (negative) *p++ = u'-';
    if (field == 0 && m == 0) {
        *p++ = u'0';
        return static_cast<std::size_t>(p - out);
    }
    int e = -1074;
    if (field != 0) {
        m |= std::uint64_t(1) << 52;
        e = field - 1075;
    }
    const int zeros = __builtin_ctzll(m);
    m >>= zeros;
    e += zeros;

    // A whole number below 10^6 has at most six digits, all of them kept
    // and none rounded: its own digits, with no scaling.
    if (e >= 0 && e <= 20 && m < (std::uint64_t(1) << 20) && (m << e) < 1000000) {
        return static_cast<std::size_t>(p - out) + formatInt(p, static_cast<std::int64_t>(m << e));
    }

    // |value| = m * 2^e. Find the decimal exponent whose six digits
    // floor(|value| * 10^(5 - exponent)) lie in [100000, 999999], starting
    // from floor(log10(2) * floor(log2 |value|)).
    int exponent = ((bitLength(m) - 1 + e) * 78913) >> 18;
    Scaled r;
    for (;;) {
        if (!scale128(m, e, 5 - exponent, r)) scaleBig(m, e, 5 - exponent, r);
        if (r.quotient < 100000)
            --exponent;
        else if (r.quotient >= 1000000)
            ++exponent;
        else
            break;
    }
    // Ties away from zero.
    std::uint32_t digits = static_cast<std::uint32_t>(r.quotient) + (r.half >= 0 ? 1 : 0);
    if (digits == 1000000) {
        digits = 100000;
        ++exponent;
    }

    char16_t d[6];
    for (int i = 5; i >= 0; --i) {
        d[i] = static_cast<char16_t>(u'0' + digits % 10);
        digits /= 10;
    }
    int last = 5;  // index of the last significant digit to keep
    while (last > 0 && d[last] == u'0') --last;

    if (exponent < -4 || exponent >= 6) {
        *p++ = d[0];
        if (last > 0) {
            *p++ = u'.';
            for (int i = 1; i <= last; ++i) *p++ = d[i];
        }
        *p++ = u'e';
        *p++ = exponent < 0 ? u'-' : u'+';
        const int a = exponent < 0 ? -exponent : exponent;  // at most 324
        *p++ = static_cast<char16_t>(u'0' + a / 100);
        *p++ = static_cast<char16_t>(u'0' + a / 10 % 10);
        *p++ = static_cast<char16_t>(u'0' + a % 10);
    } else if (exponent >= 0) {
        for (int i = 0; i <= exponent; ++i) *p++ = d[i];
        if (last > exponent) {
            *p++ = u'.';
            for (int i = exponent + 1; i <= last; ++i) *p++ = d[i];
        }
    } else {
        *p++ = u'0';
        *p++ = u'.';
        for (int i = 0; i < -exponent - 1; ++i) *p++ = u'0';
        for (int i = 0; i <= last; ++i) *p++ = d[i];
    }
    return static_cast<std::size_t>(p - out);
}

std::size_t formatInt(char16_t* out, std::int64_t value) {
    std::uint64_t magnitude = static_cast<std::uint64_t>(value);
    std::size_t n = 0;
    if (value < 0) {
        out[n++] = u'-';
        magnitude = 0 - magnitude;
    }
    char16_t digits[20];
    int count = 0;
    do {
        digits[count++] = static_cast<char16_t>(u'0' + magnitude % 10);
        magnitude /= 10;
    } while (magnitude);
    while (count > 0) out[n++] = digits[--count];
    return n;
}

void appendFloat(std::u16string& out, double value) {
    char16_t text[kMaxFloatText];
    out.append(text, formatFloat(text, value));
}

void appendInt(std::u16string& out, std::int64_t value) {
    char16_t text[kMaxIntText];
    out.append(text, formatInt(text, value));
}

}  // namespace platform
