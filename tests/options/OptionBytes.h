#pragma once
// Helpers of the options tests: hand-laid option records and a document's
// parts. A record is a string of row types in file order, each row with a value
// from its holder and row number, so that a field read from the wrong row
// shows. Row types: b bool32, i i32, f f32, d f64, c color, t transform, s
// wstring; the document adds P, F, S, C (the params, frame data, stamp and
// camera records), T (a texture flag, always absent) and L (the channel list).
#include "options/AllOptions.h"
#include "support/Golden.h"
#include "support/RecordBytes.h"
#include "xml/AssetXmlWriter.h"

namespace opttest {

using namespace OrvaneLumoCore;
using namespace testsupport;

enum Holder { kParams, kFrame, kDocument, kCamera };

// Values by holder and row; flags are set in odd rows and clear in even ones.
inline std::int32_t intAt(Holder h, int row) { return 1000 * (h + 1) + row; }
inline float floatAt(Holder h, int row) { return 100.0f * h + row + 0.25f; }
inline std::int32_t flagAt(Holder h, int row) { return row % 2 ? intAt(h, row) : 0; }
inline std::string textAt(Holder h, int row) { return "text" + std::to_string(intAt(h, row)); }

// The tag of a record: the version in the high half; AllOptions has 1 in the low.
inline std::uint32_t tag(int version) { return static_cast<std::uint32_t>(version) << 16; }
inline std::uint32_t documentTag(int version) { return tag(version) | 1u; }

inline void layRow(RecordBytes& b, Holder h, char type, int row) {
    switch (type) {
    case 'b': b.i32(flagAt(h, row)); break;
    case 'i': b.i32(intAt(h, row)); break;
    case 'f': b.f32(floatAt(h, row)); break;
    case 'd': b.f64(floatAt(h, row)); break;
    case 'c': b.vec(floatAt(h, row), floatAt(h, row) + 1, floatAt(h, row) + 2); break;
    case 't': b.transform(Transform()); break;
    case 's': b.wstr(textAt(h, row)); break;
    }
}

// A version 1 record of the rows `types` with the values of `h`.
inline RecordBytes rowsRecord(Holder h, const char* types) {
    RecordBytes b;
    b.u32(tag(1));
    for (int row = 1; types[row - 1]; ++row) layRow(b, h, types[row - 1], row);
    return b;
}

// ---- params: 173 rows. Versions below 5 hold a single f32 in place of rows 74
// to 77; version 1 lacks row 140, versions below 3 row 144, below 4 row 145.
const char kParamsRowTypes[] =
    "biiiifiifb" "bibfifibif" "bifbiiiifi" "iififfifbb" "bfffififii"  //   1-50
    "biiiiifffb" "iibbbbbbsi" "bisbffiifi" "biifbbbbsf" "ibfsififib"  //  51-100
    "biisbbsibi" "bibbfiffib" "bssiffiiii" "iiibfffifi" "ibbbfbbbbb"  // 101-150
    "bbbibbifbb" "bfibbfbibf" "bii";                                  // 151-173
static_assert(sizeof kParamsRowTypes == 173 + 1, "173 rows");

inline bool paramsRowInVersion(int row, int version) {
    if (row >= 74 && row <= 77) return version >= 5;
    if (row == 140) return version >= 2;
    if (row == 144) return version >= 3;
    return row != 145 || version >= 4;
}

// `asSaved` gives the form that save writes after loading the record: rows
// 133 and 135 hold the constants 0 and 1.0, row 140 the 2 of every load.
inline RecordBytes paramsRecord(int version, bool asSaved = false) {
    RecordBytes b;
    b.u32(tag(version));
    for (int row = 1; row <= 173; ++row) {
        if (row == 74 && version < 5) b.f32(-7.5f);  // the single f32 of old versions
        if (!paramsRowInVersion(row, version)) continue;
        if (asSaved && row == 133) b.i32(0);
        else if (asSaved && row == 135) b.f32(1.0f);
        else if (asSaved && row == 140) b.i32(2);
        else layRow(b, kParams, kParamsRowTypes[row - 1], row);
    }
    return b;
}

// ---- frame data: 47 rows; physical camera version 1: 28 rows, the animated
// rows 3 and 14 as f32.
const char kFrameRowTypes[] = "dddittffff" "ffiffififb" "fficcccccf" "fffiiiiiii" "ifiiiff";
const char kCameraV1RowTypes[] = "ifffffffff" "ffbfbffbcb" "bifffbbi";
static_assert(sizeof kFrameRowTypes == 47 + 1 && sizeof kCameraV1RowTypes == 28 + 1, "47 and 28 rows");

// ---- stamp info, version 1: three i32, the text, 60 raw font bytes.
inline RecordBytes stampV1Record() {
    RecordBytes b;
    b.u32(tag(1)).i32(1).i32(2).i32(3).wstr("stamp");
    for (int k = 0; k < 60; ++k) b.u8(static_cast<std::uint8_t>(k));
    return b;
}

// ---- AllOptions: 72 rows.
const char kDocumentRowTypes[] =
    "PFSCTTccbb" "iiibbbbbbb" "ibbfffffff" "fffbLsssss" "ssssscibbb"  //  1-50
    "ifccffffbb" "TTbfffibis" "ib";                                   // 51-72
static_assert(sizeof kDocumentRowTypes == 72 + 1, "72 rows");
// The first version that holds each row; versions 10 to 15 don't exist.
const int kDocumentRowSince[72] = {
    0, 0, 0, 5, 0, 0, 0, 0, 0, 0,  0, 0, 0, 0, 0, 0, 0, 0, 0, 2,    //  1-20
    3, 5, 6, 0, 0, 0, 0, 0, 0, 0,  0, 4, 4, 4, 0, 0, 0, 0, 0, 0,    // 21-40
    0, 0, 0, 0, 0, 1, 1, 7, 7, 8,  8, 8, 9, 9, 9, 9, 9, 9, 9, 9,    // 41-60
    9, 9, 16, 17, 17, 18, 19, 20, 20, 20, 22, 23};                   // 61-72
const int kDocumentVersions[] = {0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 16, 17, 18, 19, 20, 21, 22, 23};

inline RecordBytes documentRecord(int version, const std::vector<std::uint32_t>& channels, int paramsVersion = 5) {
    RecordBytes b;
    b.u32(documentTag(version));
    for (int row = 1; row <= 72; ++row) {
        if (version < kDocumentRowSince[row - 1]) continue;
        switch (kDocumentRowTypes[row - 1]) {
        case 'P': b.append(paramsRecord(paramsVersion)); break;
        case 'F': b.append(rowsRecord(kFrame, kFrameRowTypes)); break;
        case 'S': b.append(stampV1Record()); break;
        case 'C': b.append(rowsRecord(kCamera, kCameraV1RowTypes)); break;
        case 'T': b.u8(0); break;
        case 'L':
            b.u32(static_cast<std::uint32_t>(channels.size()));
            for (std::uint32_t c : channels) b.u32(c);
            break;
        default: layRow(b, kDocument, kDocumentRowTypes[row - 1], row);
        }
    }
    return b;
}

// ---- the document.
inline std::u16string documentXml(AllOptions& o) {
    std::u16string out;
    AssetXmlWriter w(out);
    w.openRoot(u"orvopt");
    o.writeXml(w, u"");
    w.closeRoot();
    return out;
}

// The Assets element that holds the asset with `url`.
inline std::u16string assetsOf(const std::u16string& doc, const std::u16string& url) {
    const std::size_t at = doc.find(u"url=\"" + url + u"\" >");
    if (at == std::u16string::npos) return std::u16string();
    const std::size_t begin = doc.rfind(u"  <Assets>\n", at), end = doc.find(u"  </Assets>\n", at) + 12;
    return doc.substr(begin, end - begin);
}

// The text of a parameter from its head to its closing line, and its inline value.
inline std::u16string param(const std::u16string& block, const std::u16string& name) {
    const std::size_t at = block.find(u"name=\"" + name + u"\"");
    if (at == std::u16string::npos) return std::u16string();
    const std::size_t begin = block.rfind(u"<parameter ", at), end = block.find(u"</parameter>\n", at) + 13;
    return block.substr(begin, end - begin);
}
inline std::u16string inlineValue(const std::u16string& block, const std::u16string& name) {
    const std::u16string p = param(block, name);
    const std::size_t at = p.find(u"<value>");
    return at == std::u16string::npos ? u"(none)" : p.substr(at + 7, p.find(u"</value>") - at - 7);
}

}  // namespace opttest
