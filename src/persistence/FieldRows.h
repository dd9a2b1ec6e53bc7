#pragma once
// Records described once, as tables of rows: the one row form of every
// record table of the model.
//
// A `RecordRow` is one field of a record: the member that holds it (a
// FieldRef), the versions of the record that hold it, its default, and what
// the row does besides reading and writing the field. `readFields`,
// `writeFields`, `resetFields` and `fieldsEqual` walk a table in order, so a
// class's table reads like its record, and adding a field is one line. The
// XML parameters that show such fields are described beside the writer, in
// xml/ParamRows.h.
//
// The encoding follows from the member's type: bool as bool8, int32 as i32
// (a bool32 too, which keeps the whole value), float as f32, double as f64,
// Color as color, AColor as acolor, Vector as vector, Transform as
// transform, TransformD as a transform of f32, std::u16string as wstring,
// std::string (narrow text) as wstring. Two members take a named form: a file
// path (`FieldRef::path`, compared without regard to case) and a bool held as
// bool32 (`FieldRef::bool32`).
//
// A row that needs code of its own (a child record, a texture, bytes that
// depend on other fields) is a hook row: the walkers hand it to the class's
// hook, with the code number the table gives it. A record whose layout
// branches inside a version is not a table; it is written by hand.
//
// A row also says how its field is shown in the XML: the parameter's name,
// its place among the class's parameters where that order differs from the
// record's, a label, and for a child texture the word of its url. The writer
// walks the same table (xml/ParamRows.h, writeShownFields), so a field is
// named in one row only.
#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string>
#include <type_traits>

#include <boost/shared_ptr.hpp>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

class BaseTexture;
class BaseMaterial;
class BaseUVW;

// FieldRef::get checks that a row holds the type asked for in debug builds,
// in sanitizer builds, and where ORVXML_FIELD_KIND_CHECKS is defined.
#if !defined(NDEBUG) || defined(__SANITIZE_ADDRESS__) || defined(ORVXML_FIELD_KIND_CHECKS)
constexpr bool kFieldKindChecks = true;
#elif defined(__has_feature)
#if __has_feature(address_sanitizer) || __has_feature(undefined_behavior_sanitizer)
constexpr bool kFieldKindChecks = true;
#else
constexpr bool kFieldKindChecks = false;
#endif
#else
constexpr bool kFieldKindChecks = false;
#endif

// A row was asked for a type it doesn't hold: a fault of the code, not of
// the data, so the program stops.
[[noreturn]] inline void fieldKindMismatch(int kind) {
    std::fprintf(stderr, "FieldRef::get: the row of kind %d doesn't hold the type asked for\n", kind);
    std::abort();
}

// A field of class C, of one of the types above; or none, for rows whose
// bytes belong to no field.
template <class C>
class FieldRef {
public:
    enum class Kind {
        None, Bool, Bool32, Int, Float, Double, Color, AColor, Vector, Transform, TransformD,
        WString, Path, NarrowText, Texture, Material, Generator
    };

    // Not explicit: a table row is written with the bare member pointer. The
    // parameter types are members of C, so a field declared in a base class
    // of C converts as well.
    constexpr FieldRef() : kind_(Kind::None), bound_(false), i_(nullptr) {}
    constexpr FieldRef(bool C::*m) : kind_(Kind::Bool), b_(m) {}
    constexpr FieldRef(std::int32_t C::*m) : kind_(Kind::Int), i_(m) {}
    constexpr FieldRef(float C::*m) : kind_(Kind::Float), f_(m) {}
    constexpr FieldRef(double C::*m) : kind_(Kind::Double), d_(m) {}
    constexpr FieldRef(Color C::*m) : kind_(Kind::Color), c_(m) {}
    constexpr FieldRef(AColor C::*m) : kind_(Kind::AColor), a_(m) {}
    constexpr FieldRef(Vector C::*m) : kind_(Kind::Vector), v_(m) {}
    constexpr FieldRef(Transform C::*m) : kind_(Kind::Transform), t_(m) {}
    constexpr FieldRef(TransformD C::*m) : kind_(Kind::TransformD), td_(m) {}
    constexpr FieldRef(std::u16string C::*m) : kind_(Kind::WString), s_(m) {}
    constexpr FieldRef(std::string C::*m) : kind_(Kind::NarrowText), n_(m) {}
    // A child texture, material or UVW generator: its bytes and its
    // comparison are the class's code (a hook row), since they depend on the
    // child's family.
    constexpr FieldRef(boost::shared_ptr<BaseTexture> C::*m) : kind_(Kind::Texture), x_(m) {}
    constexpr FieldRef(boost::shared_ptr<BaseMaterial> C::*m) : kind_(Kind::Material), mt_(m) {}
    constexpr FieldRef(boost::shared_ptr<BaseUVW> C::*m) : kind_(Kind::Generator), g_(m) {}
    static constexpr FieldRef path(std::u16string C::*m) { return FieldRef(Kind::Path, m); }
    static constexpr FieldRef bool32(bool C::*m) { return FieldRef(Kind::Bool32, m); }
    // The bytes of `kind` that belong to no field (constant and dropped rows).
    static constexpr FieldRef unbound(Kind kind) {
        FieldRef row(kind, static_cast<bool C::*>(nullptr));
        row.bound_ = false;
        return row;
    }

    constexpr Kind kind() const { return kind_; }
    constexpr bool isChild() const {
        return kind_ == Kind::Texture || kind_ == Kind::Material || kind_ == Kind::Generator;
    }

    void read(QuickArchive& ar, C& obj) const {
        switch (kind_) {
            case Kind::None:
            case Kind::Texture:
            case Kind::Material:
            case Kind::Generator: break;
            case Kind::Bool: ar.readByte(obj.*b_); break;
            case Kind::Bool32: {
                std::int32_t flag = (obj.*b_) ? 1 : 0;
                ar.readInt(flag);
                obj.*b_ = flag != 0;
                break;
            }
            case Kind::Int: ar.readInt(obj.*i_); break;
            case Kind::Float: ar.readFloat(obj.*f_); break;
            case Kind::Double: ar.readDouble(obj.*d_); break;
            case Kind::Color: ar.readColor(obj.*c_); break;
            case Kind::AColor: ar.readAColor(obj.*a_); break;
            case Kind::Vector: ar.readVector(obj.*v_); break;
            case Kind::Transform: ar.readTransform(obj.*t_); break;
            case Kind::TransformD: {
                // A read behind the end of the data leaves the field as it was.
                TransformD& field = obj.*td_;
                Transform narrow = narrowed(field);
                ar.readTransform(narrow);
                field.m = narrow.m;
                for (int k = 0; k < 3; ++k) field.offs[k] = narrow.offs[k];
                break;
            }
            case Kind::WString:
            case Kind::Path: ar.readWString(obj.*s_); break;
            case Kind::NarrowText: {
                // An empty stored text keeps the text the field has.
                std::u16string text;
                ar.readWString(text);
                if (!text.empty()) obj.*n_ = wideToUtf8(text);
                break;
            }
        }
    }

    void write(QuickArchive& ar, const C& obj) const {
        switch (kind_) {
            case Kind::None:
            case Kind::Texture:
            case Kind::Material:
            case Kind::Generator: break;
            case Kind::Bool: ar.writeByte(obj.*b_); break;
            case Kind::Bool32: ar.writeInt(obj.*b_ ? 1 : 0); break;
            case Kind::Int: ar.writeInt(obj.*i_); break;
            case Kind::Float: ar.writeFloat(obj.*f_); break;
            case Kind::Double: ar.writeDouble(obj.*d_); break;
            case Kind::Color: ar.writeColor(obj.*c_); break;
            case Kind::AColor: ar.writeAColor(obj.*a_); break;
            case Kind::Vector: ar.writeVector(obj.*v_); break;
            case Kind::Transform: ar.writeTransform(obj.*t_); break;
            case Kind::TransformD: ar.writeTransform(narrowed(obj.*td_)); break;
            case Kind::WString:
            case Kind::Path: ar.writeWString(obj.*s_); break;
            case Kind::NarrowText: ar.writeWString(utf8ToWide(obj.*n_)); break;
        }
    }

    // Floats compare with ==, text exactly, a path without regard to case.
    bool equal(const C& x, const C& y) const {
        switch (kind_) {
            case Kind::None: return true;
            case Kind::Bool:
            case Kind::Bool32: return x.*b_ == y.*b_;
            case Kind::Int: return x.*i_ == y.*i_;
            case Kind::Float: return x.*f_ == y.*f_;
            case Kind::Double: return x.*d_ == y.*d_;
            case Kind::Color: return x.*c_ == y.*c_;
            case Kind::AColor: return x.*a_ == y.*a_;
            case Kind::Vector: return x.*v_ == y.*v_;
            case Kind::Transform: return x.*t_ == y.*t_;
            case Kind::TransformD: {
                const TransformD &a = x.*td_, &b = y.*td_;
                return a.m == b.m && a.offs[0] == b.offs[0] && a.offs[1] == b.offs[1] && a.offs[2] == b.offs[2];
            }
            case Kind::WString: return x.*s_ == y.*s_;
            case Kind::Path: return platform::iequals(x.*s_, y.*s_);
            case Kind::NarrowText: return x.*n_ == y.*n_;
            case Kind::Texture: return x.*x_ == y.*x_;
            case Kind::Material: return x.*mt_ == y.*mt_;
            case Kind::Generator: return x.*g_ == y.*g_;
        }
        return false;
    }

    // Sets the field to `number` (numbers and flags), `color` (colours, and
    // the three components of a vector) or both (`color` with alpha
    // `number`); a transform becomes the identity, a transform of f32 all
    // zero, the matrix included, text empty and a child null.
    void reset(C& obj, double number, const Color& color) const {
        switch (kind_) {
            case Kind::None: break;
            case Kind::Bool:
            case Kind::Bool32: obj.*b_ = number != 0; break;
            case Kind::Int: obj.*i_ = static_cast<std::int32_t>(number); break;
            case Kind::Float: obj.*f_ = static_cast<float>(number); break;
            case Kind::Double: obj.*d_ = number; break;
            case Kind::Color: obj.*c_ = color; break;
            case Kind::AColor:  // `color`, alpha `number`
                obj.*a_ = AColor(color.r, color.g, color.b, static_cast<float>(number));
                break;
            case Kind::Vector: obj.*v_ = Vector(color.r, color.g, color.b); break;
            case Kind::Transform: obj.*t_ = Transform(); break;
            case Kind::TransformD: {
                TransformD& field = obj.*td_;
                field.m = Matrix(Vector(0, 0, 0), Vector(0, 0, 0), Vector(0, 0, 0));
                field.offs[0] = field.offs[1] = field.offs[2] = 0;
                break;
            }
            case Kind::WString:
            case Kind::Path: (obj.*s_).clear(); break;
            case Kind::NarrowText: (obj.*n_).clear(); break;
            case Kind::Texture: (obj.*x_).reset(); break;
            case Kind::Material: (obj.*mt_).reset(); break;
            case Kind::Generator: (obj.*g_).reset(); break;
        }
    }

    // Whether the row holds a field of type T: T is the type of the field's
    // kind (std::u16string for a path, bool for a bool32), and the row names
    // a member (an unbound row doesn't).
    template <class T>
    constexpr bool holds() const {
        return bound_ && kindHolds<T>(kind_);
    }

    // The field in `obj`. The row must hold a T (see holds()); builds with
    // field checks stop the program when it doesn't, rather than read the
    // wrong member of the union.
    template <class T>
    const T& get(const C& obj) const {
        if (kFieldKindChecks && !holds<T>()) fieldKindMismatch(static_cast<int>(kind_));
        if constexpr (std::is_same<T, bool>::value) return obj.*b_;
        else if constexpr (std::is_same<T, std::int32_t>::value) return obj.*i_;
        else if constexpr (std::is_same<T, float>::value) return obj.*f_;
        else if constexpr (std::is_same<T, double>::value) return obj.*d_;
        else if constexpr (std::is_same<T, Color>::value) return obj.*c_;
        else if constexpr (std::is_same<T, AColor>::value) return obj.*a_;
        else if constexpr (std::is_same<T, Vector>::value) return obj.*v_;
        else if constexpr (std::is_same<T, Transform>::value) return obj.*t_;
        else if constexpr (std::is_same<T, TransformD>::value) return obj.*td_;
        else if constexpr (std::is_same<T, std::string>::value) return obj.*n_;
        else if constexpr (std::is_same<T, boost::shared_ptr<BaseTexture>>::value) return obj.*x_;
        else if constexpr (std::is_same<T, boost::shared_ptr<BaseMaterial>>::value) return obj.*mt_;
        else if constexpr (std::is_same<T, boost::shared_ptr<BaseUVW>>::value) return obj.*g_;
        else {
            static_assert(std::is_same<T, std::u16string>::value, "not a type a field row holds");
            return obj.*s_;
        }
    }
    template <class T>
    T& get(C& obj) const {
        return const_cast<T&>(get<T>(static_cast<const C&>(obj)));
    }

    // A TransformD as the record holds it: the offset in f32.
    static Transform narrowed(const TransformD& t) {
        return Transform(t.m, Vector(static_cast<float>(t.offs[0]), static_cast<float>(t.offs[1]),
                                     static_cast<float>(t.offs[2])));
    }

private:
    template <class T>
    static constexpr bool kindHolds(Kind k) {
        if constexpr (std::is_same<T, bool>::value) return k == Kind::Bool || k == Kind::Bool32;
        else if constexpr (std::is_same<T, std::int32_t>::value) return k == Kind::Int;
        else if constexpr (std::is_same<T, float>::value) return k == Kind::Float;
        else if constexpr (std::is_same<T, double>::value) return k == Kind::Double;
        else if constexpr (std::is_same<T, Color>::value) return k == Kind::Color;
        else if constexpr (std::is_same<T, AColor>::value) return k == Kind::AColor;
        else if constexpr (std::is_same<T, Vector>::value) return k == Kind::Vector;
        else if constexpr (std::is_same<T, Transform>::value) return k == Kind::Transform;
        else if constexpr (std::is_same<T, TransformD>::value) return k == Kind::TransformD;
        else if constexpr (std::is_same<T, std::string>::value) return k == Kind::NarrowText;
        else if constexpr (std::is_same<T, boost::shared_ptr<BaseTexture>>::value) return k == Kind::Texture;
        else if constexpr (std::is_same<T, boost::shared_ptr<BaseMaterial>>::value) return k == Kind::Material;
        else if constexpr (std::is_same<T, boost::shared_ptr<BaseUVW>>::value) return k == Kind::Generator;
        else if constexpr (std::is_same<T, std::u16string>::value) return k == Kind::WString || k == Kind::Path;
        else return false;
    }

    constexpr FieldRef(Kind kind, std::u16string C::*m) : kind_(kind), s_(m) {}
    constexpr FieldRef(Kind kind, bool C::*m) : kind_(kind), b_(m) {}

    Kind kind_;
    bool bound_ = true;
    union {
        bool C::*b_;
        std::int32_t C::*i_;
        float C::*f_;
        double C::*d_;
        Color C::*c_;
        AColor C::*a_;
        Vector C::*v_;
        Transform C::*t_;
        TransformD C::*td_;
        std::u16string C::*s_;
        std::string C::*n_;
        boost::shared_ptr<BaseTexture> C::*x_;
        boost::shared_ptr<BaseMaterial> C::*mt_;
        boost::shared_ptr<BaseUVW> C::*g_;
    };
};

constexpr int kLastVersion = 0x7FFF;

// What a row does besides reading and writing its field.
enum class RowUse : std::uint8_t {
    Field,    // the field, with its default
    Kept,     // the field; reset leaves it as it is
    Const,    // no field: written as the constant default, read and dropped
    Dropped,  // no field: read and dropped, written as zero (old versions only)
    Forced,   // the field, read and then set to the default: it is the default after any load
    Hook,     // the class's own code, given `hook`; the field, if any, is the hook's
    Shown,    // no bytes: the field once more in the XML, under another name
    Unstored, // no bytes: a field that no record version holds, with its default
};

// How a row's field is shown in the XML. A row without a name isn't shown.
struct RowXml {
    const char* name = nullptr;
    // The parameter's place among the class's parameters, from 1, where the
    // XML order isn't the record's; 0: the row's place in the table.
    int at = 0;
    const char* label = "";
    bool userData = false;
    bool asFlag = false;          // an integer shown as a bool: any value but 0 is 1
    const char16_t* slot = nullptr;  // a child's url word
    int form = 0;  // nonzero: a form of the class's own, written by its hook
    // The parameter's name in the class's second XML form, where it has one
    // (none: the second form leaves the field out).
    const char* otherName = nullptr;
    // The block of a document written as several Assets that shows the
    // parameter; 0: the class's own Asset.
    int group = 0;
};

// The code number of a hook row that has no field, for tables written as
// lists: {&C::count, RowHook{kBaseRecord}}.
struct RowHook {
    int code;
};

// One row of a record: the field, the versions `since` to `until` that hold
// it, its default (`number`, `color` for colours and vectors, both for a
// colour with alpha) and its use. A row written as &C::field,
// {&C::field, since} or {&C::field, since, until} is a plain field; its
// default is zero (false, black, empty) unless .byDefault(value) gives
// another. A child texture or material is a hook row with code 0.
//
// A row shown in the XML names its parameter, and where the XML order isn't
// the record's, its place there: {&C::field, "name", 3}, or with the version
// that brought the field, {&C::field, 2, "name", 3}. Label, flag form, user
// data, url word and a form of the class's own are set on the row:
// RecordRow<C>(&C::tex, "tex").slot(u"texture").
template <class C>
struct RecordRow {
    constexpr RecordRow() = default;
    template <class M>
    constexpr RecordRow(M C::*m, int first = 1, int last = kLastVersion)
        : RecordRow(FieldRef<C>(m), first, last) {}
    constexpr RecordRow(FieldRef<C> f, int first = 1, int last = kLastVersion)
        : field(f), since(first), until(last), use(f.isChild() ? RowUse::Hook : RowUse::Field) {}
    template <class M>
    constexpr RecordRow(M C::*m, const char* name, int at = 0) : RecordRow(FieldRef<C>(m), 1, name, at) {}
    template <class M>
    constexpr RecordRow(M C::*m, int first, const char* name, int at = 0)
        : RecordRow(FieldRef<C>(m), first, name, at) {}
    constexpr RecordRow(FieldRef<C> f, const char* name, int at = 0) : RecordRow(f, 1, name, at) {}
    constexpr RecordRow(FieldRef<C> f, int first, const char* name, int at = 0) : RecordRow(f, first) {
        xml.name = name;
        xml.at = at;
    }
    constexpr RecordRow(RowHook h, int first = 1, int last = kLastVersion)
        : since(first), until(last), use(RowUse::Hook), hook(h.code) {}

    // The field shown once more, as parameter `name` at place `at`.
    template <class M>
    static constexpr RecordRow shownAgain(M C::*m, const char* name, int at = 0) {
        RecordRow row(FieldRef<C>(m), name, at);
        row.use = RowUse::Shown;
        return row;
    }

    // A copy of the row with one column set.
    template <class T, class V>
    constexpr RecordRow with(T RecordRow::*column, V value) const {
        RecordRow row = *this;
        row.*column = value;
        return row;
    }
    template <class T, class V>
    constexpr RecordRow withXml(T RowXml::*column, V value) const {
        RecordRow row = *this;
        row.xml.*column = value;
        return row;
    }

    constexpr RecordRow labelled(const char* text, bool userData = false) const {
        return withXml(&RowXml::label, text).withXml(&RowXml::userData, userData);
    }
    constexpr RecordRow asFlag() const { return withXml(&RowXml::asFlag, true); }
    constexpr RecordRow userData() const { return withXml(&RowXml::userData, true); }
    constexpr RecordRow slot(const char16_t* word) const { return withXml(&RowXml::slot, word); }
    constexpr RecordRow alsoAs(const char* name) const { return withXml(&RowXml::otherName, name); }
    // The field shown as parameter `name`, at place `at` (0: table order).
    constexpr RecordRow shownAs(const char* name, int at = 0) const {
        return withXml(&RowXml::name, name).withXml(&RowXml::at, at);
    }
    // The field shown as parameter `name` at place `at` of a document's block `group`.
    constexpr RecordRow shownIn(int group, const char* name, int at) const {
        return shownAs(name, at).withXml(&RowXml::group, group);
    }
    // The field's default.
    constexpr RecordRow byDefault(double value) const { return with(&RecordRow::number, value); }
    constexpr RecordRow byDefault(const Color& value) const { return with(&RecordRow::color, value); }
    constexpr RecordRow byDefault(const AColor& value) const {
        return with(&RecordRow::color, Color(value.r, value.g, value.b)).with(&RecordRow::number, value.a);
    }
    constexpr RecordRow byDefault(const Vector& value) const {
        return with(&RecordRow::color, Color(value.x, value.y, value.z));
    }
    // The field shown in a form of the class's own: the XML walk hands the
    // row to the class's hook with `xml.form` set to `code`.
    constexpr RecordRow shownBy(int code) const { return withXml(&RowXml::form, code); }
    // The code that a hook row hands to the class's hook.
    constexpr RecordRow coded(int code) const { return with(&RecordRow::hook, code); }

    FieldRef<C> field;
    int since = 1;
    int until = kLastVersion;
    double number = 0;
    Color color;
    RowUse use = RowUse::Field;
    int hook = 0;
    RowXml xml;

    bool inVersion(int version) const { return version >= since && version <= until; }
    bool hasBytes() const { return use != RowUse::Shown && use != RowUse::Unstored; }
    // A field with a default, which reset gives it.
    bool hasDefault() const { return use == RowUse::Field || use == RowUse::Forced || use == RowUse::Unstored; }
};

// Row builders, so that a table with defaults reads like the record it
// describes: RowsOf<P>::i32(&P::count, 4, 2) is an i32 with default 4 held
// since version 2. The encoding is the field's; the builder's name says it.
template <class C>
struct RowsOf {
    typedef RecordRow<C> R;
    static constexpr R row(FieldRef<C> f, double number, int since, RowUse use = RowUse::Field,
                           int until = kLastVersion) {
        R r;
        r.field = f;
        r.number = number;
        r.since = since;
        r.until = until;
        r.use = use;
        return r;
    }
    static constexpr R b8(bool C::*m, bool def, int since = 0) { return row(m, def, since); }
    static constexpr R b32(bool C::*m, bool def, int since = 0) { return row(FieldRef<C>::bool32(m), def, since); }
    // A bool32 held in an i32 field keeps the whole value.
    static constexpr R b32(std::int32_t C::*m, double def, int since = 0) { return row(m, def, since); }
    static constexpr R i32(std::int32_t C::*m, double def, int since = 0) { return row(m, def, since); }
    static constexpr R f32(float C::*m, double def, int since = 0) { return row(m, def, since); }
    static constexpr R f64(double C::*m, double def, int since = 0) { return row(m, def, since); }
    static constexpr R color(Color C::*m, Color def, int since = 0) {
        R r = row(m, 0, since);
        r.color = def;
        return r;
    }
    // Defaults to all zero, the matrix included.
    static constexpr R transformD(TransformD C::*m, int since = 0) { return row(m, 0, since); }
    static constexpr R narrowText(std::string C::*m, int since = 0) { return row(m, 0, since); }
    static constexpr R wideText(std::u16string C::*m, int since = 0) { return row(m, 0, since); }
    static constexpr R keptF32(float C::*m, int since) { return row(m, 0, since, RowUse::Kept); }
    static constexpr R constI32(std::int32_t value, int since = 0) {
        return row(unbound(Kind::Int), value, since, RowUse::Const);
    }
    static constexpr R constF32(float value, int since = 0) {
        return row(unbound(Kind::Float), value, since, RowUse::Const);
    }
    static constexpr R droppedF32(int since, int until) {
        return row(unbound(Kind::Float), 0, since, RowUse::Dropped, until);
    }
    static constexpr R forcedI32(std::int32_t C::*m, std::int32_t value, int since = 0) {
        return row(m, value, since, RowUse::Forced);
    }
    // A field that no record holds: only reset sets it.
    template <class M>
    static constexpr R unstored(M C::*m, double def) { return row(m, def, 0, RowUse::Unstored); }
    static constexpr R hook(int code, int since = 0, FieldRef<C> f = FieldRef<C>(), double def = 0) {
        R r = row(f, def, since, RowUse::Hook);
        r.hook = code;
        return r;
    }

private:
    using Kind = typename FieldRef<C>::Kind;
    static constexpr FieldRef<C> unbound(Kind kind) { return FieldRef<C>::unbound(kind); }
};

// Reads one row. A read behind the end of the data leaves the field as it
// was. Hook rows are the caller's.
template <class C>
void readRow(QuickArchive& ar, C& obj, const RecordRow<C>& row) {
    switch (row.use) {
        case RowUse::Field:
        case RowUse::Kept: row.field.read(ar, obj); break;
        case RowUse::Forced: {
            std::int32_t dropped = 0;
            ar.readInt(dropped);
            row.field.reset(obj, row.number, row.color);
            break;
        }
        case RowUse::Const:
        case RowUse::Dropped:
            if (row.field.kind() == FieldRef<C>::Kind::Int) {
                std::int32_t dropped = 0;
                ar.readInt(dropped);
            } else {
                float dropped = 0;
                ar.readFloat(dropped);
            }
            break;
        case RowUse::Hook:
        case RowUse::Shown:
        case RowUse::Unstored: break;
    }
}

// Writes one row. Hook rows are the caller's.
template <class C>
void writeRow(QuickArchive& ar, const C& obj, const RecordRow<C>& row) {
    switch (row.use) {
        case RowUse::Field:
        case RowUse::Kept:
        case RowUse::Forced: row.field.write(ar, obj); break;
        case RowUse::Const:
        case RowUse::Dropped: {
            const double value = row.use == RowUse::Const ? row.number : 0;
            if (row.field.kind() == FieldRef<C>::Kind::Int)
                ar.writeInt(static_cast<std::int32_t>(value));
            else
                ar.writeFloat(static_cast<float>(value));
            break;
        }
        case RowUse::Hook:
        case RowUse::Shown:
        case RowUse::Unstored: break;
    }
}

// Walks the rows that `version` holds and that have bytes, in table order:
// a hook row goes to `hook(row)`, which returns false to end the walk, every
// other row to `plain(row)`. `rows` is an array or a RowSpan of RecordRow<C>.
template <class C, class Rows, class Plain, class Hook>
bool walkRecord(const Rows& rows, int version, Plain plain, Hook hook) {
    for (const RecordRow<C>& row : rows) {
        if (!row.inVersion(version) || !row.hasBytes()) continue;
        if (row.use != RowUse::Hook)
            plain(row);
        else if (!hook(row))
            return false;
    }
    return true;
}

// Reads the rows that `version` holds; a hook row goes to `hook(row)`, which
// returns false to end the load.
template <class C, class Rows, class Hook>
bool readFields(QuickArchive& ar, C& obj, const Rows& rows, int version, Hook hook) {
    return walkRecord<C>(rows, version, [&](const RecordRow<C>& row) { readRow(ar, obj, row); }, hook);
}

template <class C, class Rows>
void readFields(QuickArchive& ar, C& obj, const Rows& rows, int version) {
    readFields(ar, obj, rows, version, [](const RecordRow<C>&) { return true; });
}

// Writes the rows that `version` holds; a hook row goes to `hook(row)`,
// which returns false to end the save.
template <class C, class Rows, class Hook>
bool writeFields(QuickArchive& ar, const C& obj, const Rows& rows, int version, Hook hook) {
    return walkRecord<C>(rows, version, [&](const RecordRow<C>& row) { writeRow(ar, obj, row); }, hook);
}

template <class C, class Rows>
void writeFields(QuickArchive& ar, const C& obj, const Rows& rows, int version) {
    writeFields(ar, obj, rows, version, [](const RecordRow<C>&) { return true; });
}

// Gives every field row its default; kept, const, dropped, hook and shown
// rows stay.
template <class C, class Rows>
void resetFields(C& obj, const Rows& rows) {
    for (const RecordRow<C>& row : rows)
        if (row.hasDefault()) row.field.reset(obj, row.number, row.color);
}

// The same for the rows of `version` only: a table that also lists a field at
// its place in old versions gives the default on the row of `version`.
template <class C, class Rows>
void resetFields(C& obj, const Rows& rows, int version) {
    for (const RecordRow<C>& row : rows)
        if (row.inVersion(version) && row.hasDefault()) row.field.reset(obj, row.number, row.color);
}

// True if every field of the table (of the rows of `version`, where given)
// is equal in both objects; hook rows are the caller's.
template <class C, class Rows>
bool fieldsEqual(const C& x, const C& y, const Rows& rows, int version = -1) {
    for (const RecordRow<C>& row : rows) {
        if (version >= 0 && !row.inVersion(version)) continue;
        if ((row.hasDefault() || row.use == RowUse::Kept) && !row.field.equal(x, y)) return false;
    }
    return true;
}

// A flat record: resets `obj` and reads a version tag of 1 to `newest`, then
// the rows that the version holds. Returns the version, or -1 for a tag that
// isn't listed.
template <class C, class Rows>
int loadFlatRecord(C& obj, QuickArchive& ar, const Rows& rows, int newest) {
    const int v = resetAndReadVersion(obj, ar, newest);
    if (v < 0) return -1;
    readFields(ar, obj, rows, v);
    return v;
}

// Writes the tag of version `newest` and the rows of that version; true,
// since a flat record has nothing that can fail.
template <class C, class Rows>
bool saveFlatRecord(const C& obj, QuickArchive& ar, const Rows& rows, int newest) {
    writeVersion(ar, newest);
    writeFields(ar, obj, rows, newest);
    return true;
}

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

}  // namespace OrvaneLumoCore
