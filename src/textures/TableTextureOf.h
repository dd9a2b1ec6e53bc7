#pragma once
// Base of a texture class whose record is one table of rows (one per child
// and field, with the XML parameter that shows it): save, load, the
// comparison, the copies and the XML all walk the table, with the texture
// family's child policy (textures/TextureRows.h). The class's defaults are
// the table's: its constructor calls setTableDefaults() (and makes the
// children that a new object holds), and `reset` assigns a new object.
//
// The source file of a class declares its table,
//
//   TextureTable<Class> textureTable(const Class&);  // version and rows
//
// in this namespace, includes textures/TextureRows.h, and instantiates
// TableTextureOf<Class, Tag> there. A row shown in a form of the class's own
// (RecordRow::shownBy) goes to the class's
//
//   void writeOwnForm(AssetXmlWriter& w, const RecordRow<Class>& row) const;
#include <cstdint>
#include <string>

#include "persistence/FamilyOf.h"
#include "persistence/FieldRows.h"
#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

template <class C>
struct TextureTable {
    int newest;  // the version save writes; load reads 1 to it
    RowSpan<RecordRow<C>> rows;
};

template <class Derived, std::uint32_t Tag>
class TableTextureOf : public FamilyOf<Derived, Tag, BaseTexture> {
public:
    bool save(QuickArchive& ar) const override;  // false, writing nothing, without a required child
    bool load(QuickArchive& ar) override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    void finishClone();
    bool sameContent(const Derived& o) const;
    // No form of its own: a class that has one declares this again.
    void writeOwnForm(AssetXmlWriter&, const RecordRow<Derived>&) const {}

protected:
    void setTableDefaults();
};

}  // namespace OrvaneLumoCore
