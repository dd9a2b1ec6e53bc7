#pragma once
// XML parameters described by the rows of record tables (persistence/FieldRows.h).
//
// A row with a name shows its field as a parameter, in the form that follows
// from the field's type: bool, integer, float (a double narrowed), color,
// acolor, vector, transform (a TransformD's offset narrowed), string, and a
// file name for a path. An integer field that holds a flag is shown as a bool
// (the row's `asFlag`). The parameters follow the places that the rows give.
#include <cstddef>
#include <cstdint>
#include <limits>
#include <vector>

#include "persistence/FieldRows.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

// One XML parameter and the field it shows. An empty label shows the name.
template <class C>
struct ParamRow {
    const char* name;
    FieldRef<C> field;
    const char* label = "";
    bool isUserData = false;
    // An integer shown as a bool: any value but 0 is 1.
    bool shownAsFlag = false;
};

template <class C>
void writeParam(AssetXmlWriter& w, const ParamRow<C>& row, const C& obj) {
    using Kind = typename FieldRef<C>::Kind;
    const FieldRef<C>& f = row.field;
    const char* name = row.name;
    const WriterText label(row.label);
    if (row.shownAsFlag && f.kind() == Kind::Int)
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

// The parameter that a record row shows, as a ParamRow.
template <class C>
ParamRow<C> shownParam(const RecordRow<C>& row) {
    return ParamRow<C>{row.xml.name, row.field, row.xml.label, row.xml.userData, row.xml.asFlag};
}

// Calls `visit(row)` for each row of a record table that a parameter of the
// class's own Asset shows (the rows with a name and no group): in the order of their places where the rows give
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
        if (!row.xml.name || row.xml.group != 0) continue;
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
    const auto own = [](const RecordRow<C>& row) { return row.xml.name && row.xml.group == 0; };
    for (int place = 1; place <= places; ++place)
        for (const RecordRow<C>& row : rows)
            if (own(row) && row.xml.at == place) visit(row);
    for (const RecordRow<C>& row : rows)
        if (own(row) && row.xml.at == 0) visit(row);
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

// Writes the parameters of a class's own table and of a part's table (a
// base or member of the class that other classes hold too, with a table of
// its own) as one block: the placed rows of both in the order of their
// places, then those without a place, the class's own first.
template <class C, class P, class Rows, class PartRows>
void writeShownFieldsWithPart(AssetXmlWriter& w, const C& obj, const Rows& rows, const P& part,
                              const PartRows& partRows) {
    const ShownRows<C> own = shownRows<C>(rows);
    const ShownRows<P> shared = shownRows<P>(partRows);
    const auto place = [](const RowXml& xml) { return xml.at != 0 ? xml.at : std::numeric_limits<int>::max(); };
    const auto noHook = [](const auto&) {};
    std::size_t i = 0, k = 0;
    while (i < own.size() || k < shared.size()) {
        if (k == shared.size() || (i < own.size() && place(own[i]->xml) <= place(shared[k]->xml)))
            writeShownRow(w, obj, *own[i++], noHook);
        else
            writeShownRow(w, part, *shared[k++], noHook);
    }
}

}  // namespace OrvaneLumoCore
