#pragma once
#include <string>

namespace platform {

// A new random (version 4) UUID as text: lower-case hex digits in the
// 8-4-4-4-12 form, without braces.
std::u16string newUuidString();

}  // namespace platform
