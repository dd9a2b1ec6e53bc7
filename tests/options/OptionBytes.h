#pragma once
// Helpers of the options tests: hand-laid option records and loading them.
#include <cstdint>
#include <string>
#include <vector>

#include "animation/RecordBytes.h"
#include "options/AllOptions.h"
#include "persistence/QuickArchive.h"

namespace opttest {

using animtest::RecordBytes;
using animtest::savedBytes;

// A wstring as the archive stores it: the UTF-8 byte length, then the bytes.
inline RecordBytes& wstr(RecordBytes& b, const std::string& utf8) {
    b.u32(static_cast<std::uint32_t>(utf8.size()));
    return b.append(std::vector<std::uint8_t>(utf8.begin(), utf8.end()));
}

// The tag of a params record: the version in the high half.
inline std::uint32_t tag(int version) { return static_cast<std::uint32_t>(version) << 16; }

// The tag of an AllOptions record: the version in the high half and 1 in the low.
inline std::uint32_t documentTag(int version) { return tag(version) | 1u; }

// Types of the 173 rows of the params record, in order: b bool32, i i32,
// f f32, s wstring. Versions below 5 hold a single f32 in place of rows 74
// to 77; version 1 lacks row 140, versions below 3 row 144, below 4 row 145.
const char kParamsRowTypes[] =
    "biiiifiifb" "bibfifibif" "bifbiiiifi" "iififfifbb" "bfffififii"  //   1-50
    "biiiiifffb" "iibbbbbbsi" "bisbffiifi" "biifbbbbsf" "ibfsififib"  //  51-100
    "biisbbsibi" "bibbfiffib" "bssiffiiii" "iiibfffifi" "ibbbfbbbbb"  // 101-150
    "bbbibbifbb" "bfibbfbibf" "bii";                                  // 151-173

// Distinct values by row number, so that a shifted row shows.
inline std::int32_t rowInt(int row) { return 1000 + row; }
inline float rowFloat(int row) { return static_cast<float>(row) + 0.25f; }
inline std::string rowText(int row) { return "path" + std::to_string(row); }

inline bool rowInVersion(int row, int version) {
    if (row >= 74 && row <= 77) return version >= 5;
    if (row == 140) return version >= 2;
    if (row == 144) return version >= 3;
    if (row == 145) return version >= 4;
    return true;
}

// A params record of `version` with the row values above. `asSaved` gives
// the form that save writes after loading it: rows 133 and 135 hold the
// constants 0 and 1.0, and row 140 the 2 that every load leaves there.
inline RecordBytes paramsRecord(int version, bool asSaved = false) {
    RecordBytes b;
    b.u32(tag(version));
    for (int row = 1; row <= 173; ++row) {
        if (row == 74 && version < 5) b.f32(-7.5f);  // the single f32 of old versions
        if (!rowInVersion(row, version)) continue;
        if (asSaved && row == 133) { b.i32(0); continue; }
        if (asSaved && row == 135) { b.f32(1.0f); continue; }
        if (asSaved && row == 140) { b.i32(2); continue; }
        switch (kParamsRowTypes[row - 1]) {
        case 'b':
        case 'i': b.i32(rowInt(row)); break;
        case 'f': b.f32(rowFloat(row)); break;
        case 's': wstr(b, rowText(row)); break;
        }
    }
    return b;
}

template <class T>
bool loadFrom(T& object, const RecordBytes& bytes) {
    OrvaneLumoCore::QuickArchive ar = bytes.archive();
    return object.load(ar);
}

}  // namespace opttest
