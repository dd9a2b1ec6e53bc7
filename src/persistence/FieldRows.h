#pragma once
// Flat records and parameter blocks described once, as tables of rows.
//
// A `RecordRow` names a plain field of a class by its member pointer and the
// versions of the record that hold it; `readFields` and `writeFields` walk a
// table in order, so a class's table reads like its record. The XML
// parameters that show such fields are described beside the writer, in
// xml/ParamRows.h.
//
// The encoding of a field follows from its type: bool as bool8, int32 as
// i32, float as f32, Color as color, AColor as acolor, Vector as vector,
// Transform as transform, std::u16string as wstring. A file path
// (`FieldRef::path`) is a wstring too, but compares without regard to case
// and goes out as a file name parameter.
#include <cstddef>
#include <cstdint>
#include <string>
#include <type_traits>

#include "persistence/QuickArchive.h"
#include "persistence/Types.h"
#include "platform/WideChar.h"

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

    // The field in `obj`; T is the type of the field's kind (std::u16string for a path).
    template <class T>
    const T& get(const C& obj) const {
        if constexpr (std::is_same<T, bool>::value) return obj.*b_;
        else if constexpr (std::is_same<T, std::int32_t>::value) return obj.*i_;
        else if constexpr (std::is_same<T, float>::value) return obj.*f_;
        else if constexpr (std::is_same<T, Color>::value) return obj.*c_;
        else if constexpr (std::is_same<T, AColor>::value) return obj.*a_;
        else if constexpr (std::is_same<T, Vector>::value) return obj.*v_;
        else if constexpr (std::is_same<T, Transform>::value) return obj.*t_;
        else return obj.*s_;
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

}  // namespace OrvaneLumoCore
