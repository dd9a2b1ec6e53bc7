#pragma once
// The writer's UTF-16 text, piece by piece, as code points, the form in which
// an interpreter's string is made. A surrogate pair becomes one code point
// even when a piece ends between its halves; a lone surrogate stays one code
// point of its own, so nothing is lost. A zero unit ends the text, as it ends the zero-terminated text from which
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
            for (; i + 8 <= size && plainRun(text + i); i += 8, o += 8) widen(text + i, o);
            if (i == size) break;
            const char16_t c = text[i];
            if (static_cast<char16_t>(c - 1) < kLastPlain || c > 0xDBFF) {  // 1 to D7FF, DC00 to FFFF
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

    // The end of the text: a high surrogate still waiting stands alone.
    template <class Unit>
    std::size_t finishUtf32(Unit* out) {
        if (!pendingHigh_) return 0;
        *out = static_cast<Unit>(pendingHigh_);
        pendingHigh_ = 0;
        return 1;
    }

private:
    static constexpr char16_t kLastPlain = 0xD7FF;

    // True if each of the eight units at `p` is from 1 to kLastPlain.
    static bool plainRun(const char16_t* p) {
#if defined(__SSE2__)
        // Unsigned (unit - 1) < kLastPlain, as a signed comparison of the values
        // with their top bit flipped.
        const __m128i flip = _mm_set1_epi16(static_cast<short>(0x8000));
        const __m128i v = _mm_loadu_si128(reinterpret_cast<const __m128i*>(p));
        const __m128i shifted = _mm_xor_si128(_mm_sub_epi16(v, _mm_set1_epi16(1)), flip);
        const __m128i limit = _mm_xor_si128(_mm_set1_epi16(static_cast<short>(kLastPlain)), flip);
        return _mm_movemask_epi8(_mm_cmplt_epi16(shifted, limit)) == 0xFFFF;
#else
        bool plain = true;
        for (int k = 0; k < 8; ++k) plain &= static_cast<char16_t>(p[k] - 1) < kLastPlain;
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

    static bool isLow(char16_t c) { return c >= 0xDC00 && c <= 0xDFFF; }
    static char32_t join(char16_t high, char16_t low) {
        return 0x10000 + ((static_cast<char32_t>(high) - 0xD800) << 10) + (low - 0xDC00);
    }

    char16_t pendingHigh_ = 0;
    bool ended_ = false;
};
