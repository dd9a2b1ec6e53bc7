#pragma once
// Number text as the original runtime's stream insertion printed it, made
// without printf or a locale: the digits come from exact integer arithmetic.
#include <cstddef>
#include <cstdint>
#include <string>

namespace platform {

// Room that formatFloat and formatInt need at most ("-1.23457e-308" and
// "-9223372036854775808").
constexpr std::size_t kMaxFloatText = 16;
constexpr std::size_t kMaxIntText = 20;

// Writes `value` in the default stream format (printf "%g") to `out` and
// returns the number of units written: six significant digits of the exact
// value, ties rounded away from zero, trailing zeros and a trailing point
// removed, fixed notation for decimal exponents -4 to 5 and scientific
// notation beyond, with an exponent of at least three digits ("1e+006",
// "1.23457e-005"). Infinities and NaNs give the runtime's texts.
std::size_t formatFloat(char16_t* out, double value);

// Writes a decimal integer with a leading "-" where negative; returns the
// number of units written.
std::size_t formatInt(char16_t* out, std::int64_t value);

// The same, appended to a string.
void appendFloat(std::u16string& out, double value);
void appendInt(std::u16string& out, std::int64_t value);

}  // namespace platform
