#pragma once
// Records of the texture family in the one record row form, and the one
// child-member policy of the family:
//
//   - a texture row is an optional texture member (a bool8 "present", then
//     tag and record), or a required one (tag and record) where the row is
//     coded kRequiredChild; it is read with createTexture;
//   - a UVW generator row is a required member, read with createUVW;
//   - a required child that is missing makes `save` fail before anything is
//     written.
//
// In the XML every child has a slot (the row's url word, else its parameter
// name) and a `plugin` parameter that refers to it, where the row's place
// among the parameters puts it. With these a texture whose record is flat
// names each field and child once, in its table; rows that need code of
// their own are hook rows with codes from kFirstClassCode on.
#include <cstring>
#include <string>
#include <utility>

#include <boost/container/small_vector.hpp>

#include "persistence/FieldRows.h"
#include "persistence/Record.h"
#include "textures/BaseTexture.h"
#include "textures/BaseUVW.h"
#include "textures/TableTextureOf.h"
#include "textures/TextureFrame.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

// Codes of the family's child rows; a class's own hook rows use codes from
// kFirstClassCode on.
enum TextureRowCode { kOptionalChild = 0, kRequiredChild = 1, kFirstClassCode = 2 };

template <class C>
constexpr RecordRow<C> required(RecordRow<C> row) {
    return row.coded(kRequiredChild);
}

template <class C>
bool isTextureChild(const RecordRow<C>& row) {
    return row.field.kind() == FieldRef<C>::Kind::Texture && row.use == RowUse::Hook;
}
template <class C>
bool isGeneratorChild(const RecordRow<C>& row) {
    return row.field.kind() == FieldRef<C>::Kind::Generator && row.use == RowUse::Hook;
}

template <class C>
bool loadTextureChild(QuickArchive& ar, C& obj, const RecordRow<C>& row) {
    if (isGeneratorChild(row)) return loadRequiredMember(ar, row.field.template get<UVWPtr>(obj), createUVW);
    TexturePtr& texture = row.field.template get<TexturePtr>(obj);
    return row.hook == kRequiredChild ? loadRequiredMember(ar, texture, createTexture)
                                      : loadOptionalMember(ar, texture, createTexture);
}

template <class C>
bool saveTextureChild(QuickArchive& ar, const C& obj, const RecordRow<C>& row) {
    if (isGeneratorChild(row)) return saveRequiredMember(ar, row.field.template get<UVWPtr>(obj));
    const TexturePtr& texture = row.field.template get<TexturePtr>(obj);
    return row.hook == kRequiredChild ? saveRequiredMember(ar, texture) : saveOptionalMember(ar, texture);
}

// Resets `obj` and reads a version tag of 1 to `newest`, then the rows that
// the version holds. False for a refused tag or a child that doesn't load.
template <class C, class Rows>
bool loadTextureRecord(C& obj, QuickArchive& ar, const Rows& rows, int newest) {
    const int v = resetAndReadVersion(obj, ar, newest);
    if (v < 0) return false;
    return readFields(ar, obj, rows, v, [&](const RecordRow<C>& row) { return loadTextureChild(ar, obj, row); });
}

// Writes the tag of version `newest` and the rows of that version; false,
// with nothing written, if a required child is missing.
template <class C, class Rows>
bool saveTextureRecord(const C& obj, QuickArchive& ar, const Rows& rows, int newest) {
    for (const RecordRow<C>& row : rows) {
        if (isGeneratorChild(row) && !row.field.template get<UVWPtr>(obj)) return false;
        if (isTextureChild(row) && row.hook == kRequiredChild && !row.field.template get<TexturePtr>(obj))
            return false;
    }
    writeVersion(ar, newest);
    return writeFields(ar, obj, rows, newest, [&](const RecordRow<C>& row) { return saveTextureChild(ar, obj, row); });
}

// Every row equal: plain fields as the row form compares them, children
// through their own isEqual.
template <class C, class Rows>
bool rowsEqual(const C& a, const C& b, const Rows& rows) {
    for (const RecordRow<C>& row : rows) {
        if (isGeneratorChild(row) &&
            !childrenEqual(row.field.template get<UVWPtr>(a), row.field.template get<UVWPtr>(b)))
            return false;
        if (isTextureChild(row) &&
            !childrenEqual(row.field.template get<TexturePtr>(a), row.field.template get<TexturePtr>(b)))
            return false;
    }
    return fieldsEqual(a, b, rows);
}

// On a fresh copy: every child of the table cloned.
template <class C, class Rows>
void cloneTextureRows(C& copy, const Rows& rows) {
    for (const RecordRow<C>& row : rows) {
        if (isGeneratorChild(row)) {
            UVWPtr& generator = row.field.template get<UVWPtr>(copy);
            generator = cloneChild(generator);
        } else if (isTextureChild(row)) {
            TexturePtr& texture = row.field.template get<TexturePtr>(copy);
            texture = cloneChild(texture);
        }
    }
}

// The Asset of a texture whose table names its parameters, given the rows
// that parameters show in their order (shownRows): a slot per child in that
// order, then the parameters, a child referred to from its slot. Hook rows
// that aren't children go to `hook(row)`.
template <class C, class Hook>
void writeTextureRows(AssetXmlWriter& w, const C& obj, const std::u16string& url, const ShownRows<C>& shown,
                      Hook hook) {
    TextureFrame frame(w, obj, url);
    // A table has a few children, so their slots stay on the stack.
    boost::container::small_vector<std::pair<const RecordRow<C>*, SlotRef>, 4> slots;
    for (const RecordRow<C>* row : shown) {
        if (!isGeneratorChild(*row) && !isTextureChild(*row)) continue;
        // A parameter name is ASCII, so it widens unit by unit.
        const char* name = row->xml.name;
        const std::u16string word = row->xml.slot ? std::u16string(row->xml.slot)
                                                  : std::u16string(name, name + std::strlen(name));
        slots.emplace_back(row, isGeneratorChild(*row) ? frame.slot(row->field.template get<UVWPtr>(obj), word.c_str())
                                                       : frame.slot(row->field.template get<TexturePtr>(obj), word.c_str()));
    }
    frame.open();
    writeShownFields(w, obj, shown, [&](const RecordRow<C>& row) {
        for (const auto& slot : slots)
            if (slot.first == &row) return frame.writeRef(row.xml.name, slot.second);
        hook(row);
    });
    frame.close();
}

// ---- TableTextureOf ----

template <class D, std::uint32_t Tag>
bool TableTextureOf<D, Tag>::save(QuickArchive& ar) const {
    const TextureTable<D> t = textureTable(this->self());
    return saveTextureRecord(this->self(), ar, t.rows, t.newest);
}

template <class D, std::uint32_t Tag>
bool TableTextureOf<D, Tag>::load(QuickArchive& ar) {
    D& texture = static_cast<D&>(*this);
    const TextureTable<D> t = textureTable(texture);
    return loadTextureRecord(texture, ar, t.rows, t.newest);
}

template <class D, std::uint32_t Tag>
void TableTextureOf<D, Tag>::setTableDefaults() {
    D& texture = static_cast<D&>(*this);
    resetFields(texture, textureTable(texture).rows);
}

template <class D, std::uint32_t Tag>
void TableTextureOf<D, Tag>::finishClone() {
    D& copy = static_cast<D&>(*this);
    cloneTextureRows(copy, textureTable(copy).rows);
}

template <class D, std::uint32_t Tag>
bool TableTextureOf<D, Tag>::sameContent(const D& o) const {
    return rowsEqual(this->self(), o, textureTable(this->self()).rows);
}

template <class D, std::uint32_t Tag>
void TableTextureOf<D, Tag>::writeXml(AssetXmlWriter& w, std::u16string url) {
    const D& texture = this->self();
    static const ShownRows<D> shown = shownRows<D>(textureTable(texture).rows);
    writeTextureRows(w, texture, url, shown, [&](const RecordRow<D>& row) { texture.writeOwnForm(w, row); });
}

}  // namespace OrvaneLumoCore
