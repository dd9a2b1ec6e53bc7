#pragma once
// Records of the material family in the one record row form. Besides plain
// fields a table holds optional material and texture members (their rows are
// the bare member pointers) and the base record (the row kBaseRecord). With
// these a material whose record is flat names each field once, in its table:
// reset, save, load, the comparison and the copies walk it.
#include "materials/BaseMaterial.h"
#include "materials/MaterialMembers.h"
#include "materials/MaterialOf.h"
#include "persistence/FieldRows.h"
#include "persistence/Record.h"
#include "platform/Text.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

// The base record (name, uuid) at its place in a material's record.
const RowHook kBaseRecord{1};

// The code of a texture row whose texture a copy of the material shares.
constexpr int kSharedOnCopy = 2;

// The defaults of the table's fields, children null; name and uuid stay.
template <class M, class Rows>
void resetMaterialRows(M& m, const Rows& rows) {
    resetFields(m, rows);
    for (const RecordRow<M>& row : rows)
        if (row.field.isChild()) row.field.reset(m, 0, Color());
}

// Reads a version tag of 1 to `newest` and, if `resets`, resets `m` (also
// when the tag is refused), then reads the rows that the version holds.
template <class M, class Rows>
bool loadMaterialRecord(M& m, QuickArchive& ar, const Rows& rows, int newest, bool resets = true) {
    const int v = readVersion(ar, 1, newest);
    if (resets) m.reset();
    if (v < 0) return false;
    return readFields(ar, m, rows, v, [&](const RecordRow<M>& row) {
        switch (row.field.kind()) {
        case FieldRef<M>::Kind::Material: return loadMaterialMember(ar, row.field.template get<MaterialPtr>(m));
        case FieldRef<M>::Kind::Texture: return loadTextureMember(ar, row.field.template get<TexturePtr>(m));
        default: return m.BaseMaterial::load(ar);
        }
    });
}

// Writes the tag of version `newest` and the rows of that version.
template <class M, class Rows>
bool saveMaterialRecord(const M& m, QuickArchive& ar, const Rows& rows, int newest) {
    writeVersion(ar, newest);
    return writeFields(ar, m, rows, newest, [&](const RecordRow<M>& row) {
        switch (row.field.kind()) {
        case FieldRef<M>::Kind::Material: return saveOptionalMember(ar, row.field.template get<MaterialPtr>(m));
        case FieldRef<M>::Kind::Texture: return saveOptionalMember(ar, row.field.template get<TexturePtr>(m));
        default: return m.BaseMaterial::save(ar);
        }
    });
}

// Every row equal: children through their own isEqual, plain fields as the
// row form compares them; the base record takes no part.
template <class M, class Rows>
bool materialRowsEqual(const M& a, const M& b, const Rows& rows) {
    for (const RecordRow<M>& row : rows) {
        const FieldRef<M>& f = row.field;
        if (f.kind() == FieldRef<M>::Kind::Material &&
            !childrenEqual(f.template get<MaterialPtr>(a), f.template get<MaterialPtr>(b)))
            return false;
        if (f.kind() == FieldRef<M>::Kind::Texture &&
            !childrenEqual(f.template get<TexturePtr>(a), f.template get<TexturePtr>(b)))
            return false;
    }
    return fieldsEqual(a, b, rows);
}

// On a fresh copy: child materials by their duplicate() or clone(), textures
// by their clone() but those the copy shares.
template <class M, class Rows>
void copyChildRows(M& copy, const Rows& rows, bool newName) {
    for (const RecordRow<M>& row : rows) {
        const FieldRef<M>& f = row.field;
        if (f.kind() == FieldRef<M>::Kind::Material) {
            MaterialPtr& child = f.template get<MaterialPtr>(copy);
            child = copyChild(child, newName);
        } else if (f.kind() == FieldRef<M>::Kind::Texture && row.hook != kSharedOnCopy) {
            TexturePtr& texture = f.template get<TexturePtr>(copy);
            texture = cloneChild(texture);
        }
    }
}

// ---- XML ----
//
// A texture row shown in the XML has its slot under the Asset's url, the
// row's url word or else its parameter name.

template <class M>
std::u16string slotUrlOf(const std::u16string& url, const RecordRow<M>& row) {
    return childUrl(url, row.xml.slot ? std::u16string(row.xml.slot) : utf8ToWide(row.xml.name));
}

// The Assets of the table's textures, in the order of their parameters.
template <class M, class Rows>
void writeTextureRowAssets(AssetXmlWriter& w, const M& m, const Rows& rows, const std::u16string& url) {
    forEachShown<M>(rows, [&](const RecordRow<M>& row) {
        if (row.field.kind() == FieldRef<M>::Kind::Texture)
            writeTextureAssets(w, row.field.template get<TexturePtr>(m), slotUrlOf(url, row));
    });
}

// The Assets of the table's child materials, in the order of their
// parameters, under `url`.
template <class M, class Rows>
void writeChildMaterialAssets(AssetXmlWriter& w, const M& m, const Rows& rows, const std::u16string& url) {
    forEachShown<M>(rows, [&](const RecordRow<M>& row) {
        if (row.field.kind() != FieldRef<M>::Kind::Material) return;
        const MaterialPtr& child = row.field.template get<MaterialPtr>(m);
        if (child) child->writeXml(w, url);
    });
}

// The table's parameters: fields in their form, textures referred to in
// their slots; a child material's row goes to `material(row)`.
template <class M, class Rows, class MaterialRef>
void writeMaterialParams(AssetXmlWriter& w, const M& m, const Rows& rows, const std::u16string& url,
                         MaterialRef material) {
    writeShownFields(w, m, rows, [&](const RecordRow<M>& row) {
        if (row.field.kind() == FieldRef<M>::Kind::Texture)
            writeTextureRef(w, row.xml.name, row.field.template get<TexturePtr>(m), slotUrlOf(url, row));
        else if (row.field.kind() == FieldRef<M>::Kind::Material)
            material(row);
    });
}

// Base of a material whose record is one table. The class gives
//
//   static RowSpan<RecordRow<Class>> record();  // the table, in record order
//   static constexpr int kRecordVersion = N;    // the version that save writes
//
// and gets reset (the table's defaults; name and uuid stay), save, load
// (which resets right behind the version tag, also when the tag is refused,
// unless the class says `static constexpr bool kLoadResets = false;`), the
// comparison and the copies from it. A class whose XML is its table's
// parameters under its own Asset also gets writeXml from writeTableAsset.
template <class Derived, std::uint32_t Tag>
class TableMaterialOf : public MaterialOf<Derived, Tag> {
public:
    void reset() override { resetMaterialRows(self(), Derived::record()); }
    bool save(QuickArchive& ar) const override {
        return saveMaterialRecord(self(), ar, Derived::record(), Derived::kRecordVersion);
    }
    bool load(QuickArchive& ar) override {
        return loadMaterialRecord(self(), ar, Derived::record(), Derived::kRecordVersion, Derived::kLoadResets);
    }
    bool sameContent(const Derived& o) const { return materialRowsEqual(self(), o, Derived::record()); }
    void copyChildren(bool newName) { copyChildRows(self(), Derived::record(), newName); }

    static constexpr bool kLoadResets = true;

protected:
    // The children's Assets, the textures', then the material's own Asset
    // under `url`/its name with the table's parameters.
    void writeTableAsset(AssetXmlWriter& writer, std::u16string url) {
        const Derived& m = self();
        url = childUrl(url, m.name);
        writeChildMaterialAssets(writer, m, Derived::record(), url);
        writeTextureRowAssets(writer, m, Derived::record(), url);
        openMaterialAsset(writer, m, url, "");
        writeMaterialParams(writer, m, Derived::record(), url, [&](const RecordRow<Derived>& row) {
            writeMaterialRef(writer, row.xml.name, row.field.template get<MaterialPtr>(m), url);
        });
        closeMaterialAsset(writer);
    }

private:
    Derived& self() { return static_cast<Derived&>(*this); }
    const Derived& self() const { return static_cast<const Derived&>(*this); }
};

}  // namespace OrvaneLumoCore
