// New UUIDs from the RPC runtime, as the system's own tools make them:
// UuidCreate, then UuidToStringW (lower case, no braces).
#include "platform/Uuid.h"

#include <windows.h>
#include <rpc.h>

namespace platform {

std::u16string newUuidString() {
    UUID uuid;
    RPC_WSTR text = nullptr;
    std::u16string out;
    if (UuidCreate(&uuid) == RPC_S_OK && UuidToStringW(&uuid, &text) == RPC_S_OK && text) {
        for (const unsigned short* p = text; *p; ++p) out.push_back(static_cast<char16_t>(*p));
        RpcStringFreeW(&text);
    }
    return out;
}

}  // namespace platform
