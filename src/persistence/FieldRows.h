#pragma once
// Flat records and parameter blocks described once, as tables of rows.
//
// A `RecordRow` names a plain field of a class by its member pointer and the
// versions of the record that hold it; `readFields` and `writeFields` walk a
// table in order, so a class's table reads like its record. A `ParamRow`
// names an XML parameter and the field it shows; `writeParams` writes a
// table in order with the form that follows from the field's type.
//
// The encoding of a field follows from its type: bool as bool8, int32 as
// i32, float as f32, Color as color, AColor as acolor, Vector as vector,
// Transform as transform, std::u16string as wstring. A file path
// (`FieldRef::path`) is a wstring too, but compares without regard to case
// and goes out as a file name parameter.
#include <cstddef>
#include <cstdint>
#include <string>

#include "persistence/QuickArchive.h"
#include "persistence/Types.h"
#include "platform/WideChar.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

// A plain field of class C, of one of the types above.
template <class C>
class FieldRef {
public:
    enum class Kind { Bool, Int, Float, Color, AColor, Vector, Transform, WString, Path };

    // Not explicit: a table row is written with the bare member pointer. The
    // parameter types are members of C, so a field declared in a base class
    // of C converts as well.
    constexpr FieldRef(bool C::*m) : kind_(Kind::Bool), b_(m) {}
    constexpr FieldRef(std::int32_t C::*m) : kind_(Kind::Int), i_(m) {}
    constexpr FieldRef(float C::*m) : kind_(Kind::Float), f_(m) {}
    constexpr FieldRef(Color C::*m) : kind_(Kind::Color), c_(m) {}
    constexpr FieldRef(AColor C::*m) : kind_(Kind::AColor), a_(m) {}
    constexpr FieldRef(Vector C::*m) : kind_(Kind::Vector), v_(m) {}
    constexpr FieldRef(Transform C::*m) : kind_(Kind::Transform), t_(m) {}
    constexpr FieldRef(std::u16string C::*m) : kind_(Kind::WString), s_(m) {}
    static constexpr FieldRef path(std::u16string C::*m) { return FieldRef(Kind::Path, m); }

    Kind kind() const { return kind_; }

    void read(QuickArchive& ar, C& obj) const {
        switch (kind_) {
            case Kind::Bool: ar.readByte(obj.*b_); break;
            case Kind::Int: ar.readInt(obj.*i_); break;
            case Kind::Float: ar.readFloat(obj.*f_); break;
            case Kind::Color: ar.readColor(obj.*c_); break;
            case Kind::AColor: ar.readAColor(obj.*a_); break;
            case Kind::Vector: ar.readVector(obj.*v_); break;
            case Kind::Transform: ar.readTransform(obj.*t_); break;
            case Kind::WString:
            case Kind::Path: ar.readWString(obj.*s_); break;
        }
    }

    void write(QuickArchive& ar, const C& obj) const {
        switch (kind_) {
            case Kind::Bool: ar.writeByte(obj.*b_); break;
            case Kind::Int: ar.writeInt(obj.*i_); break;
            case Kind::Float: ar.writeFloat(obj.*f_); break;
            case Kind::Color: ar.writeColor(obj.*c_); break;
            case Kind::AColor: ar.writeAColor(obj.*a_); break;
            case Kind::Vector: ar.writeVector(obj.*v_); break;
            case Kind::Transform: ar.writeTransform(obj.*t_); break;
            case Kind::WString:
            case Kind::Path: ar.writeWString(obj.*s_); break;
        }
    }

    // Floats compare with ==, text exactly.
    bool equal(const C& x, const C& y) const {
        switch (kind_) {
            case Kind::Bool: return x.*b_ == y.*b_;
            case Kind::Int: return x.*i_ == y.*i_;
            case Kind::Float: return x.*f_ == y.*f_;
            case Kind::Color: return x.*c_ == y.*c_;
            case Kind::AColor: return x.*a_ == y.*a_;
            case Kind::Vector: return x.*v_ == y.*v_;
            case Kind::Transform: return x.*t_ == y.*t_;
            case Kind::WString: return x.*s_ == y.*s_;
            case Kind::Path: return platform::iequals(x.*s_, y.*s_);
        }
        return false;
    }

    // The parameter form of the field's type; text goes out as `string`.
    void writeParam(AssetXmlWriter& w, const char* name, const WriterText& label, bool isUserData,
                    const C& obj) const {
        switch (kind_) {
            case Kind::Bool: w.writeBool(name, obj.*b_, label, isUserData); break;
            case Kind::Int: w.writeInteger(name, obj.*i_, label, isUserData); break;
            case Kind::Float: w.writeFloat(name, obj.*f_, label, isUserData); break;
            case Kind::Color: w.writeColor(name, obj.*c_, label); break;
            case Kind::AColor: w.writeAColor(name, obj.*a_, label); break;
            case Kind::Vector: w.writeVector(name, obj.*v_, label); break;
            case Kind::Transform: w.writeTransform(name, obj.*t_, label); break;
            case Kind::WString: w.writeString(name, obj.*s_, label, isUserData); break;
            case Kind::Path: w.writeFileName(name, obj.*s_, label, isUserData); break;
        }
    }

private:
    constexpr FieldRef(Kind kind, std::u16string C::*m) : kind_(kind), s_(m) {}

    Kind kind_;
    union {
        bool C::*b_;
        std::int32_t C::*i_;
        float C::*f_;
        Color C::*c_;
        AColor C::*a_;
        Vector C::*v_;
        Transform C::*t_;
        std::u16string C::*s_;
    };
};

constexpr int kLastVersion = 0x7FFF;

// One field of a record, held by the versions `since` to `until`.
template <class C>
struct RecordRow {
    FieldRef<C> field;
    int since = 1;
    int until = kLastVersion;

    bool inVersion(int version) const { return version >= since && version <= until; }
};

// A table held elsewhere, for descriptions that gather several tables.
template <class Row>
struct RowSpan {
    const Row* first = nullptr;
    const Row* last = nullptr;
    const Row* begin() const { return first; }
    const Row* end() const { return last; }
    std::size_t size() const { return static_cast<std::size_t>(last - first); }
};

template <class Row, std::size_t N>
constexpr RowSpan<Row> rowSpan(const Row (&rows)[N]) {
    return RowSpan<Row>{rows, rows + N};
}

// Reads the fields that `version` holds, in table order. `rows` is an array
// or a RowSpan of RecordRow<C>.
template <class C, class Rows>
void readFields(QuickArchive& ar, C& obj, const Rows& rows, int version) {
    for (const RecordRow<C>& row : rows)
        if (row.inVersion(version)) row.field.read(ar, obj);
}

// Writes the fields that `version` holds, in table order.
template <class C, class Rows>
void writeFields(QuickArchive& ar, const C& obj, const Rows& rows, int version) {
    for (const RecordRow<C>& row : rows)
        if (row.inVersion(version)) row.field.write(ar, obj);
}

// True if every field of the table is equal in both objects.
template <class C, class Rows>
bool fieldsEqual(const C& x, const C& y, const Rows& rows) {
    for (const RecordRow<C>& row : rows)
        if (!row.field.equal(x, y)) return false;
    return true;
}

// One XML parameter that shows a field. An empty label shows the name.
template <class C>
struct ParamRow {
    const char* name;
    FieldRef<C> field;
    const char* label = "";
    bool isUserData = false;
};

template <class C, class Rows>
void writeParams(AssetXmlWriter& w, const C& obj, const Rows& rows) {
    for (const ParamRow<C>& row : rows) row.field.writeParam(w, row.name, row.label, row.isUserData, obj);
}

}  // namespace OrvaneLumoCore
