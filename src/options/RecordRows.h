#pragma once
// Flat option records described as data. A record is a table of rows, one a
// field, in file order: how the field is encoded, which member holds it, its
// default and the record versions that hold it. `save`, `load` and `reset`
// walk the table, so the table is the one description of the record.
#include <cstdint>
#include <string>

#include "options/LumoOptions.h"
#include "persistence/QuickArchive.h"
#include "persistence/Types.h"

namespace OrvaneLumoCore {
namespace rows {

enum class Enc : std::uint8_t {
    I32,         // i32 or bool32
    F32,         // f32
    KeptF32,     // f32 that `reset` leaves alone
    F64,         // f64
    Color,       // color
    TransformD,  // transform; the offset is double in memory, f32 in the file
    NarrowText,  // wstring held as narrow text; an empty stored string keeps the text
    WideText,    // wstring
    ConstI32,    // written as the constant `def`, read and dropped
    ConstF32,    // written as the constant `def`, read and dropped
    DroppedF32,  // an f32 that old versions hold and that is read and dropped
    ForcedI32,   // i32 read and replaced by `def`; the field is `def` after any load
    Special,     // a field that the record's own code handles; `special` says which
};

constexpr int kAnyVersion = 0x7FFFFFFF;

template <class H>
struct Row {
    Enc enc;
    int since;  // first version that holds the field
    int until;  // last version that holds it
    double def = 0;
    Color defColor;
    const char* name = nullptr;
    bool ownXml = false;  // written by the holder's own writeXml
    int special = 0;
    std::int32_t H::*i = nullptr;
    float H::*f = nullptr;
    double H::*d = nullptr;
    Color H::*c = nullptr;
    LumoUtils::TransformD H::*t = nullptr;
    std::string H::*s = nullptr;
    std::u16string H::*w = nullptr;

    bool inVersion(int version) const { return version >= since && version <= until; }
};

// Builders, so that a table reads like the record it describes.
template <class H>
struct Rows {
    typedef Row<H> R;
    static R base(Enc enc, double def, int since, int until = kAnyVersion) {
        R r;
        r.enc = enc;
        r.def = def;
        r.since = since;
        r.until = until;
        return r;
    }
    static R i32(std::int32_t H::*m, double def, int since = 0) {
        R r = base(Enc::I32, def, since);
        r.i = m;
        return r;
    }
    // The bytes of a bool32 are those of an i32; the field keeps the whole value.
    static R b32(std::int32_t H::*m, double def, int since = 0) { return i32(m, def, since); }
    static R f32(float H::*m, double def, int since = 0) {
        R r = base(Enc::F32, def, since);
        r.f = m;
        return r;
    }
    static R keptF32(float H::*m, int since) {
        R r = base(Enc::KeptF32, 0, since);
        r.f = m;
        return r;
    }
    static R f64(double H::*m, double def, int since = 0) {
        R r = base(Enc::F64, def, since);
        r.d = m;
        return r;
    }
    static R color(Color H::*m, Color def, int since = 0) {
        R r = base(Enc::Color, 0, since);
        r.c = m;
        r.defColor = def;
        return r;
    }
    // Defaults to all zero, the matrix included.
    static R transformD(LumoUtils::TransformD H::*m, int since = 0) {
        R r = base(Enc::TransformD, 0, since);
        r.t = m;
        return r;
    }
    static R narrowText(std::string H::*m, int since = 0) {
        R r = base(Enc::NarrowText, 0, since);
        r.s = m;
        return r;
    }
    static R wideText(std::u16string H::*m, int since = 0) {
        R r = base(Enc::WideText, 0, since);
        r.w = m;
        return r;
    }
    static R constI32(std::int32_t value, int since = 0) { return base(Enc::ConstI32, value, since); }
    static R constF32(float value, int since = 0) { return base(Enc::ConstF32, value, since); }
    static R droppedF32(int since, int until) { return base(Enc::DroppedF32, 0, since, until); }
    static R forcedI32(std::int32_t H::*m, std::int32_t value, int since = 0) {
        R r = base(Enc::ForcedI32, value, since);
        r.i = m;
        return r;
    }
    static R special(int which, int since = 0) {
        R r = base(Enc::Special, 0, since);
        r.special = which;
        return r;
    }
    // The same row, marked as written by the holder's own XML under `name`.
    static R xml(R r, const char* name) {
        r.name = name;
        r.ownXml = true;
        return r;
    }
};

inline void narrowOffset(const LumoUtils::TransformD& from, Transform& to) {
    to.m = from.m;
    to.offs = Vector(static_cast<float>(from.offs[0]), static_cast<float>(from.offs[1]),
                     static_cast<float>(from.offs[2]));
}

// Writes one field. Special rows are the caller's.
template <class H>
void writeRow(QuickArchive& ar, const H& h, const Row<H>& r) {
    switch (r.enc) {
    case Enc::I32:
    case Enc::ForcedI32: ar.writeInt(h.*r.i); break;
    case Enc::F32:
    case Enc::KeptF32: ar.writeFloat(h.*r.f); break;
    case Enc::F64: ar.writeDouble(h.*r.d); break;
    case Enc::Color: ar.writeColor(h.*r.c); break;
    case Enc::TransformD: {
        Transform narrow;
        narrowOffset(h.*r.t, narrow);
        ar.writeTransform(narrow);
        break;
    }
    case Enc::NarrowText: ar.writeWString(utf8ToWide(h.*r.s)); break;
    case Enc::WideText: ar.writeWString(h.*r.w); break;
    case Enc::ConstI32: ar.writeInt(static_cast<std::int32_t>(r.def)); break;
    case Enc::ConstF32: ar.writeFloat(static_cast<float>(r.def)); break;
    case Enc::DroppedF32: ar.writeFloat(0.0f); break;
    case Enc::Special: break;
    }
}

// Reads one field. A read behind the end of the data leaves the field as it
// was. Special rows are the caller's.
template <class H>
void readRow(QuickArchive& ar, H& h, const Row<H>& r) {
    switch (r.enc) {
    case Enc::I32: ar.readInt(h.*r.i); break;
    case Enc::F32:
    case Enc::KeptF32: ar.readFloat(h.*r.f); break;
    case Enc::F64: ar.readDouble(h.*r.d); break;
    case Enc::Color: ar.readColor(h.*r.c); break;
    case Enc::TransformD: {
        LumoUtils::TransformD& field = h.*r.t;
        Transform narrow;
        narrowOffset(field, narrow);
        ar.readTransform(narrow);
        field.m = narrow.m;
        for (int k = 0; k < 3; ++k) field.offs[k] = narrow.offs[k];
        break;
    }
    case Enc::NarrowText: {
        std::u16string text;
        ar.readWString(text);
        if (!text.empty()) h.*r.s = wideToUtf8(text);
        break;
    }
    case Enc::WideText: ar.readWString(h.*r.w); break;
    case Enc::ConstI32:
    case Enc::ForcedI32: {
        std::int32_t dropped = 0;
        ar.readInt(dropped);
        if (r.enc == Enc::ForcedI32) h.*r.i = static_cast<std::int32_t>(r.def);
        break;
    }
    case Enc::ConstF32:
    case Enc::DroppedF32: {
        float dropped = 0;
        ar.readFloat(dropped);
        break;
    }
    case Enc::Special: break;
    }
}

// Gives a field its default.
template <class H>
void resetRow(H& h, const Row<H>& r) {
    switch (r.enc) {
    case Enc::I32:
    case Enc::ForcedI32: h.*r.i = static_cast<std::int32_t>(r.def); break;
    case Enc::F32: h.*r.f = static_cast<float>(r.def); break;
    case Enc::F64: h.*r.d = r.def; break;
    case Enc::Color: h.*r.c = r.defColor; break;
    case Enc::TransformD: {
        LumoUtils::TransformD& field = h.*r.t;
        field.m = Matrix(Vector(0, 0, 0), Vector(0, 0, 0), Vector(0, 0, 0));
        field.offs[0] = field.offs[1] = field.offs[2] = 0;
        break;
    }
    case Enc::NarrowText: (h.*r.s).clear(); break;
    case Enc::WideText: (h.*r.w).clear(); break;
    case Enc::KeptF32:
    case Enc::ConstI32:
    case Enc::ConstF32:
    case Enc::DroppedF32:
    case Enc::Special: break;
    }
}

template <class H, std::size_t N>
void writeRows(QuickArchive& ar, const H& h, const Row<H> (&table)[N], int version) {
    for (const Row<H>& r : table)
        if (r.inVersion(version)) writeRow(ar, h, r);
}

template <class H, std::size_t N>
void readRows(QuickArchive& ar, H& h, const Row<H> (&table)[N], int version) {
    for (const Row<H>& r : table)
        if (r.inVersion(version)) readRow(ar, h, r);
}

template <class H, std::size_t N>
void resetRows(H& h, const Row<H> (&table)[N]) {
    for (const Row<H>& r : table) resetRow(h, r);
}

}  // namespace rows
}  // namespace OrvaneLumoCore
