#pragma once
// Number text as the original runtime's stream insertion printed it.
#include <cstdint>
#include <string>

namespace platform {

// Appends `value` in the default stream format (printf "%g"): six significant
// digits of the exact value, ties rounded away from zero, trailing zeros and
// a trailing point removed, fixed notation for decimal exponents -4 to 5 and
// scientific notation beyond, with an exponent of at least three digits
// ("1e+006", "1.23457e-005").
void appendFloat(std::u16string& out, double value);

// Appends a decimal integer with a leading "-" where negative.
void appendInt(std::u16string& out, std::int64_t value);

}  // namespace platform
