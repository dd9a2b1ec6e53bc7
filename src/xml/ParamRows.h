#pragma once
// XML parameter blocks described once, as tables of rows.
//
// A `ParamRow` names a parameter and the field it shows (a FieldRef of
// persistence/FieldRows.h); `writeParams` writes a table in order, each in the
// form that follows from the field's type: bool, integer, float (a double
// narrowed), color, acolor, vector, transform (a TransformD's offset
// narrowed), string, and a file name for a path.
#include "persistence/FieldRows.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

// One XML parameter that shows a field. An empty label shows the name. A
// parameter in a form of its own (a reference to a child's Asset, a value
// derived from the field) names a nonzero `hook`: the class's code writes it.
template <class C>
struct ParamRow {
    const char* name;
    FieldRef<C> field;
    const char* label = "";
    bool isUserData = false;
    int hook = 0;
};

template <class C>
void writeParam(AssetXmlWriter& w, const ParamRow<C>& row, const C& obj) {
    using Kind = typename FieldRef<C>::Kind;
    const FieldRef<C>& f = row.field;
    const char* name = row.name;
    const WriterText label(row.label);
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
        case Kind::Material: break;
    }
}

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

}  // namespace OrvaneLumoCore
