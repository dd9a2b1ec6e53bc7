#pragma once
// Records of the texture family in the one record row form: a table whose
// texture rows are optional texture members (tag and record behind a bool8
// "present"), read with createTexture. With these a class whose record is
// flat names each field once, in its table.
#include "persistence/FieldRows.h"
#include "persistence/Record.h"
#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

// Resets `obj` and reads a version tag of 1 to `newest`, then the rows that
// the version holds. False for a refused tag or a child that doesn't load.
template <class C, class Rows>
bool loadTextureRecord(C& obj, QuickArchive& ar, const Rows& rows, int newest) {
    obj.reset();
    const int v = readVersion(ar, 1, newest);
    if (v < 0) return false;
    return readFields(ar, obj, rows, v, [&](const RecordRow<C>& row) {
        return loadOptionalMember(ar, row.field.template get<TexturePtr>(obj), createTexture);
    });
}

// Writes the tag of version `newest` and the rows of that version.
template <class C, class Rows>
bool saveTextureRecord(const C& obj, QuickArchive& ar, const Rows& rows, int newest) {
    writeVersion(ar, newest);
    return writeFields(ar, obj, rows, newest, [&](const RecordRow<C>& row) {
        return saveOptionalMember(ar, row.field.template get<TexturePtr>(obj));
    });
}

// Every row equal: plain fields as the row form compares them, textures
// through their own isEqual.
template <class C, class Rows>
bool rowsEqual(const C& a, const C& b, const Rows& rows) {
    for (const RecordRow<C>& row : rows) {
        if (row.field.kind() != FieldRef<C>::Kind::Texture) continue;
        const TexturePtr& x = row.field.template get<TexturePtr>(a);
        if (!childrenEqual(x, row.field.template get<TexturePtr>(b))) return false;
    }
    return fieldsEqual(a, b, rows);
}

// On a fresh copy: every texture of the table cloned.
template <class C, class Rows>
void cloneTextureRows(C& copy, const Rows& rows) {
    for (const RecordRow<C>& row : rows) {
        if (row.field.kind() != FieldRef<C>::Kind::Texture) continue;
        TexturePtr& texture = row.field.template get<TexturePtr>(copy);
        texture = cloneChild(texture);
    }
}

}  // namespace OrvaneLumoCore
