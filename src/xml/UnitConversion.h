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

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

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
        while (i < size) {
            // Runs of units from 1 to D7FF, the bulk of the text, eight at a time.
            for (; i + 8 <= size && plainRun(text + i, 0xD7FF); i += 8, o += 8) widen(text + i, o);
            if (i == size) break;
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
            ++i;
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
                o = counted(o, join(pendingHigh_, text[0]));
                i = 1;
            } else {
                o = counted(o, pendingHigh_);
            }
            pendingHigh_ = 0;
        }
        while (i < size) {
            // Runs of ASCII other than zero, the bulk of the text, eight at a time.
            for (; i + 8 <= size && plainRun(text + i, 0x7F); i += 8, o += 8) {
                narrow(text + i, o);
                codePoints_ += 8;
            }
            if (i == size) break;
            const char16_t c = text[i];
            if (static_cast<char16_t>(c - 1) < 0xD7FF || c > 0xDBFF) {
                o = counted(o, c);
            } else if (c == 0) {
                ended_ = true;
                break;
            } else if (i + 1 == size) {
                pendingHigh_ = c;
            } else if (isLow(text[i + 1])) {
                o = counted(o, join(c, text[i + 1]));
                ++i;
            } else {
                o = counted(o, c);
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
        const std::size_t n = static_cast<std::size_t>(counted(out, pendingHigh_) - out);
        pendingHigh_ = 0;
        return n;
    }

    // Of the UTF-8 written so far: the number of code points and the
    // largest one (below 0x80 if there were only ASCII runs).
    std::size_t codePoints() const { return codePoints_; }
    char32_t widest() const { return widest_; }

    // Code points of UTF-8 that toUtf8 wrote, `codePoints()` of them, into
    // units wide enough for `widest()`.
    template <class Unit>
    static void fromOwnUtf8(const char* text, std::size_t size, Unit* out) {
        const unsigned char* s = reinterpret_cast<const unsigned char*>(text);
        const unsigned char* const end = s + size;
        while (s != end) {
            for (std::uint64_t v; end - s >= 8 && (__builtin_memcpy(&v, s, 8), (v & 0x8080808080808080ull) == 0);
                 s += 8, out += 8) {
                for (int k = 0; k < 8; ++k) out[k] = static_cast<Unit>(s[k]);
            }
            if (s == end) break;
            const unsigned c = *s;
            if (c < 0x80) {
                *out++ = static_cast<Unit>(c);
                s += 1;
            } else if (c < 0xE0) {
                *out++ = static_cast<Unit>(((c & 0x1F) << 6) | (s[1] & 0x3F));
                s += 2;
            } else if (c < 0xF0) {
                *out++ = static_cast<Unit>(((c & 0x0F) << 12) | ((s[1] & 0x3F) << 6) | (s[2] & 0x3F));
                s += 3;
            } else {
                *out++ = static_cast<Unit>(((c & 0x07) << 18) | ((s[1] & 0x3F) << 12) | ((s[2] & 0x3F) << 6) |
                                           (s[3] & 0x3F));
                s += 4;
            }
        }
    }

private:
    // True if each of the eight units at `p` is from 1 to `last`.
    static bool plainRun(const char16_t* p, char16_t last) {
#if defined(__SSE2__)
        // Unsigned (unit - 1) < last, as a signed comparison of the values
        // with their top bit flipped.
        const __m128i flip = _mm_set1_epi16(static_cast<short>(0x8000));
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const __m128i shifted = _mm_xor_si128(_mm_sub_epi16(v, _mm_set1_epi16(1)), flip);
        const __m128i limit = _mm_xor_si128(_mm_set1_epi16(static_cast<short>(last)), flip);
        return _mm_movemask_epi8(_mm_cmplt_epi16(shifted, limit)) == 0xFFFF;
#else
        bool plain = true;
        for (int k = 0; k < 8; ++k) plain &= static_cast<char16_t>(p[k] - 1) < last;
        return plain;
#endif
    }
    template <class Unit>
    static void widen(const char16_t* p, Unit* o) {
#if defined(__SSE2__)
        if constexpr (sizeof(Unit) == 4) {
            const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
            const __m128i zero = _mm_setzero_si128();
            _mm_storeu_si128(reinterpret_cast<__m128i*>(o), _mm_unpacklo_epi16(v, zero));
            _mm_storeu_si128(reinterpret_cast<__m128i*>(o + 4), _mm_unpackhi_epi16(v, zero));
            return;
        }
#endif
        for (int k = 0; k < 8; ++k) o[k] = static_cast<Unit>(p[k]);
    }
    static void narrow(const char16_t* p, char* o) {
#if defined(__SSE2__)
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        _mm_storel_epi64(reinterpret_cast<__m128i*>(o), _mm_packus_epi16(v, v));
#else
        for (int k = 0; k < 8; ++k) o[k] = static_cast<char>(p[k]);
#endif
    }

    char* counted(char* o, char32_t c) {
        ++codePoints_;
        if (c > widest_) widest_ = c;
        return put(o, c);
    }

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
    std::size_t codePoints_ = 0;
    char32_t widest_ = 0;
};
