#pragma once
// XML parameter blocks described once, as tables of rows.
//
// A `ParamRow` names a parameter and the field it shows (a FieldRef of
// persistence/FieldRows.h); `writeParams` writes a table in order, each in the
// form that follows from the field's type: bool, integer, float (a double
// narrowed), color, acolor, vector, transform (a TransformD's offset
// narrowed), string, and a file name for a path. An integer field that holds
// a flag is shown as a bool (`asFlag`). A block that shows fields of several
// holders (C's member objects) reaches one of them with `fieldOf`.
#include <vector>

#include "persistence/FieldRows.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

template <class M>
struct MemberPointerTraits;
template <class C, class T>
struct MemberPointerTraits<T C::*> {
    using Class = C;
    using Type = T;
};
template <class M>
using MemberClass = typename MemberPointerTraits<M>::Class;
template <class M>
using MemberType = typename MemberPointerTraits<M>::Type;

template <class C>
struct ParamRow;

// Writes a row whose field lies in a member object of C (see fieldOf).
template <class C>
using PartWriter = void (*)(AssetXmlWriter&, const ParamRow<C>&, const C&);

// The field a parameter shows: a field of C, or one of a member object of C.
template <class C>
struct ParamField : FieldRef<C> {
    using FieldRef<C>::FieldRef;
    constexpr ParamField() = default;
    constexpr ParamField(const FieldRef<C>& f) : FieldRef<C>(f) {}
    constexpr ParamField(PartWriter<C> writer) : part(writer) {}

    PartWriter<C> part = nullptr;
    // An integer shown as a bool: any value but 0 is 1.
    bool shownAsFlag = false;
};

template <class C>
constexpr ParamField<C> asFlag(std::int32_t C::*m) {
    ParamField<C> f(m);
    f.shownAsFlag = true;
    return f;
}
template <class C>
constexpr ParamField<C> asFlag(PartWriter<C> writer) {
    ParamField<C> f(writer);
    f.shownAsFlag = true;
    return f;
}

// One XML parameter that shows a field. An empty label shows the name. A
// parameter in a form of its own (a reference to a child's Asset, a value
// derived from the field) names a nonzero `hook`: the class's code writes it.
template <class C>
struct ParamRow {
    const char* name;
    ParamField<C> field;
    const char* label = "";
    bool isUserData = false;
    int hook = 0;
};

template <class C>
void writeParam(AssetXmlWriter& w, const ParamRow<C>& row, const C& obj) {
    using Kind = typename FieldRef<C>::Kind;
    const ParamField<C>& f = row.field;
    if (f.part) return f.part(w, row, obj);
    const char* name = row.name;
    const WriterText label(row.label);
    if (f.shownAsFlag && f.kind() == Kind::Int)
        return w.writeBool(name, f.template get<std::int32_t>(obj) != 0, label, row.isUserData);
    switch (f.kind()) {
        case Kind::Bool:
        case Kind::Bool32: w.writeBool(name, f.template get<bool>(obj), label, row.isUserData); break;
        case Kind::Int: w.writeInteger(name, f.template get<std::int32_t>(obj), label, row.isUserData); break;
        case Kind::Float: w.writeFloat(name, f.template get<float>(obj), label, row.isUserData); break;
        case Kind::Double:
            w.writeFloat(name, static_cast<float>(f.template get<double>(obj)), label, row.isUserData);
            break;
        case Kind::Color: w.writeColor(name, f.template get<Color>(obj), label); break;
        case Kind::AColor: w.writeAColor(name, f.template get<AColor>(obj), label); break;
        case Kind::Vector: w.writeVector(name, f.template get<Vector>(obj), label); break;
        case Kind::Transform: w.writeTransform(name, f.template get<Transform>(obj), label); break;
        case Kind::TransformD:
            w.writeTransform(name, FieldRef<C>::narrowed(f.template get<TransformD>(obj)), label);
            break;
        case Kind::WString: w.writeString(name, f.template get<std::u16string>(obj), label, row.isUserData); break;
        case Kind::Path: w.writeFileName(name, f.template get<std::u16string>(obj), label, row.isUserData); break;
        case Kind::NarrowText: w.writeString(name, f.template get<std::string>(obj), label, row.isUserData); break;
        case Kind::None:
        case Kind::Texture:
        case Kind::Material:
        case Kind::Generator: break;
    }
}

// The row `row` of a C shows the field `Field` of its member object `Part`.
template <class C, class P, P C::*Part, auto Field>
void writeFieldOfPart(AssetXmlWriter& w, const ParamRow<C>& row, const C& obj) {
    ParamRow<P> inner{row.name, FieldRef<P>(Field), row.label, row.isUserData};
    inner.field.shownAsFlag = row.field.shownAsFlag;
    writeParam(w, inner, obj.*Part);
}

// The field `Field` of C's member object `Part`, as a row's field:
// `{"gi_on", asFlag(fieldOf<&Options::params, &Params::gi_on>)}`.
template <auto Part, auto Field>
constexpr auto fieldOf = &writeFieldOfPart<MemberClass<decltype(Part)>, MemberType<decltype(Part)>, Part, Field>;

template <class C, class Rows>
void writeParams(AssetXmlWriter& w, const C& obj, const Rows& rows) {
    for (const ParamRow<C>& row : rows) writeParam(w, row, obj);
}

// The same; a row with a hook, or one that shows a child, goes to `hook(row)`.
template <class C, class Rows, class Hook>
void writeParams(AssetXmlWriter& w, const C& obj, const Rows& rows, Hook hook) {
    for (const ParamRow<C>& row : rows) {
        if (row.hook != 0 || row.field.isChild())
            hook(row);
        else
            writeParam(w, row, obj);
    }
}

// ---- parameters that a record table shows ----

// The parameter that a record row shows, as a ParamRow.
template <class C>
ParamRow<C> shownParam(const RecordRow<C>& row) {
    ParamRow<C> p{row.xml.name, ParamField<C>(row.field), row.xml.label, row.xml.userData};
    p.field.shownAsFlag = row.xml.asFlag;
    return p;
}

// Calls `visit(row)` for each row of a record table that a parameter shows
// (the rows with a name): in the order of their places where the rows give
// places, those without a place behind them in table order; otherwise in
// table order.
template <class C, class Rows, class Visit>
void forEachShown(const Rows& rows, Visit visit) {
    // One pass sorts the placed rows by their places and keeps the others in
    // table order; a table whose places don't fit or repeat one is walked
    // once per place instead.
    constexpr int kMax = 64;
    const RecordRow<C>* byPlace[kMax + 1] = {};
    const RecordRow<C>* unplaced[kMax];
    int places = 0, others = 0;
    bool direct = true;
    for (const RecordRow<C>& row : rows) {
        if (!row.xml.name) continue;
        const int at = row.xml.at;
        if (at == 0) {
            if (others < kMax) unplaced[others] = &row;
            ++others;
            continue;
        }
        if (at > places) places = at;
        if (at > kMax || byPlace[at])
            direct = false;
        else
            byPlace[at] = &row;
    }
    if (direct && others <= kMax) {
        for (int place = 1; place <= places; ++place)
            if (byPlace[place]) visit(*byPlace[place]);
        for (int k = 0; k < others; ++k) visit(*unplaced[k]);
        return;
    }
    for (int place = 1; place <= places; ++place)
        for (const RecordRow<C>& row : rows)
            if (row.xml.name && row.xml.at == place) visit(row);
    for (const RecordRow<C>& row : rows)
        if (row.xml.name && row.xml.at == 0) visit(row);
}

// The rows of a table that parameters show, in the order of forEachShown. A
// class whose table never changes keeps them in a static, so that writing
// walks no more than its parameters.
template <class C>
using ShownRows = std::vector<const RecordRow<C>*>;

template <class C, class Rows>
ShownRows<C> shownRows(const Rows& rows) {
    ShownRows<C> shown;
    forEachShown<C>(rows, [&](const RecordRow<C>& row) { shown.push_back(&row); });
    return shown;
}

// Writes the parameter of one shown row. A child's row, a hook row and a
// row shown in a form of the class's own go to `hook(row)`.
template <class C, class Hook>
void writeShownRow(AssetXmlWriter& w, const C& obj, const RecordRow<C>& row, Hook& hook) {
    if (row.field.isChild() || row.use == RowUse::Hook || row.xml.form != 0)
        hook(row);
    else
        writeParam(w, shownParam(row), obj);
}

// Writes the parameters that the rows of a record table show, in the order
// of forEachShown.
template <class C, class Rows, class Hook>
void writeShownFields(AssetXmlWriter& w, const C& obj, const Rows& rows, Hook hook) {
    forEachShown<C>(rows, [&](const RecordRow<C>& row) { writeShownRow(w, obj, row, hook); });
}

// The same for rows already in their order.
template <class C, class Hook>
void writeShownFields(AssetXmlWriter& w, const C& obj, const ShownRows<C>& shown, Hook hook) {
    for (const RecordRow<C>* row : shown) writeShownRow(w, obj, *row, hook);
}

template <class C, class Rows>
void writeShownFields(AssetXmlWriter& w, const C& obj, const Rows& rows) {
    writeShownFields(w, obj, rows, [](const RecordRow<C>&) {});
}

}  // namespace OrvaneLumoCore
