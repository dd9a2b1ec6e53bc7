#pragma once
// The writer's UTF-16 text, piece by piece, as code points (UTF-32) or as
// UTF-8, the forms in which an interpreter's string is made. A surrogate
// pair becomes one code point even when a piece ends between its halves; a
// lone surrogate stays one code point of its own (in UTF-8 its three-byte
// form, which a "surrogatepass" decoder reads back), so nothing is lost.
// A zero unit ends the text, as it ends the zero-terminated text from which
// the interpreter's "u" format builds a string.
#include <cstddef>
#include <cstdint>

class ResultEncoder {
public:
    // Most output units that a piece of `size` units can give.
    static constexpr std::size_t maxUtf32(std::size_t size) { return size + 1; }
    static constexpr std::size_t maxUtf8(std::size_t size) { return 3 * (size + 1); }

    // Writes the code points of the next piece to `out`; returns how many.
    // A high surrogate at the end of the piece waits for the next one.
    template <class Unit>
    std::size_t toUtf32(const char16_t* text, std::size_t size, Unit* out) {
        static_assert(sizeof(Unit) >= 4, "a code point needs 21 bits");
        if (ended_) return 0;
        Unit* o = out;
        std::size_t i = 0;
        if (pendingHigh_ && size > 0) {
            if (isLow(text[0])) {
                *o++ = static_cast<Unit>(join(pendingHigh_, text[0]));
                i = 1;
            } else {
                *o++ = static_cast<Unit>(pendingHigh_);
            }
            pendingHigh_ = 0;
        }
        for (; i < size; ++i) {
            const char16_t c = text[i];
            if (static_cast<char16_t>(c - 1) < 0xD7FF || c > 0xDBFF) {  // 1 to D7FF, DC00 to FFFF
                *o++ = static_cast<Unit>(c);
            } else if (c == 0) {
                ended_ = true;
                break;
            } else if (i + 1 == size) {
                pendingHigh_ = c;
            } else if (isLow(text[i + 1])) {
                *o++ = static_cast<Unit>(join(c, text[i + 1]));
                ++i;
            } else {
                *o++ = static_cast<Unit>(c);
            }
        }
        return static_cast<std::size_t>(o - out);
    }

    // The same as UTF-8.
    std::size_t toUtf8(const char16_t* text, std::size_t size, char* out) {
        if (ended_) return 0;
        char* o = out;
        std::size_t i = 0;
        if (pendingHigh_ && size > 0) {
            if (isLow(text[0])) {
                o = put(o, join(pendingHigh_, text[0]));
                i = 1;
            } else {
                o = put(o, pendingHigh_);
            }
            pendingHigh_ = 0;
        }
        while (i < size) {
            // Runs of ASCII, the bulk of the text, eight units at a time.
            while (i + 8 <= size) {
                std::uint64_t a, b;
                __builtin_memcpy(&a, text + i, 8);
                __builtin_memcpy(&b, text + i + 4, 8);
                const std::uint64_t ones = 0x0001000100010001ull, highs = 0x8000800080008000ull;
                const std::uint64_t zeros = ((a - ones) & ~a) | ((b - ones) & ~b);
                if (((a | b) & 0xFF80FF80FF80FF80ull) | (zeros & highs)) break;
                for (int k = 0; k < 8; ++k) o[k] = static_cast<char>(text[i + k]);
                o += 8;
                i += 8;
            }
            if (i == size) break;
            const char16_t c = text[i];
            if (static_cast<char16_t>(c - 1) < 0xD7FF || c > 0xDBFF) {
                o = put(o, c);
            } else if (c == 0) {
                ended_ = true;
                break;
            } else if (i + 1 == size) {
                pendingHigh_ = c;
            } else if (isLow(text[i + 1])) {
                o = put(o, join(c, text[i + 1]));
                ++i;
            } else {
                o = put(o, c);
            }
            ++i;
        }
        return static_cast<std::size_t>(o - out);
    }

    // The end of the text: a high surrogate still waiting stands alone.
    template <class Unit>
    std::size_t finishUtf32(Unit* out) {
        if (!pendingHigh_) return 0;
        *out = static_cast<Unit>(pendingHigh_);
        pendingHigh_ = 0;
        return 1;
    }
    std::size_t finishUtf8(char* out) {
        if (!pendingHigh_) return 0;
        const std::size_t n = static_cast<std::size_t>(put(out, pendingHigh_) - out);
        pendingHigh_ = 0;
        return n;
    }

private:
    static bool isLow(char16_t c) { return c >= 0xDC00 && c <= 0xDFFF; }
    static char32_t join(char16_t high, char16_t low) {
        return 0x10000 + ((static_cast<char32_t>(high) - 0xD800) << 10) + (low - 0xDC00);
    }
    static char* put(char* o, char32_t c) {
        if (c < 0x80) {
            *o++ = static_cast<char>(c);
        } else if (c < 0x800) {
            *o++ = static_cast<char>(0xC0 | (c >> 6));
            *o++ = static_cast<char>(0x80 | (c & 0x3F));
        } else if (c < 0x10000) {
            *o++ = static_cast<char>(0xE0 | (c >> 12));
            *o++ = static_cast<char>(0x80 | ((c >> 6) & 0x3F));
            *o++ = static_cast<char>(0x80 | (c & 0x3F));
        } else {
            *o++ = static_cast<char>(0xF0 | (c >> 18));
            *o++ = static_cast<char>(0x80 | ((c >> 12) & 0x3F));
            *o++ = static_cast<char>(0x80 | ((c >> 6) & 0x3F));
            *o++ = static_cast<char>(0x80 | (c & 0x3F));
        }
        return o;
    }

    char16_t pendingHigh_ = 0;
    bool ended_ = false;
};
