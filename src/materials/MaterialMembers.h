#pragma once
// Small pieces that the wrapping materials share: the byte forms of their
// material and texture members, the copies of a child, and the urls and
// plugin references of their own Assets.
#include <string>

#include "materials/BaseMaterial.h"
#include "persistence/Record.h"
#include "textures/BaseTexture.h"
#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

// ---- record members ----------------------------------------------------------

// Optional material member: bool8 present, then u32 tag and record.
inline bool loadMaterialMember(QuickArchive& ar, MaterialPtr& member) {
    return loadOptionalMember(ar, member, &createMaterial);
}

// Bare material: u32 tag and record, no present flag.
inline bool loadBareMaterial(QuickArchive& ar, MaterialPtr& member) {
    return loadRequiredMember(ar, member, &createMaterial);
}

// Optional texture member: bool8 present, then the tag and the record.
inline bool loadTextureMember(QuickArchive& ar, TexturePtr& member) {
    return loadOptionalMember(ar, member, &createTexture);
}

// ---- copies --------------------------------------------------------------------

// A child material for duplicate() (`newName`: the child's own duplicate())
// or clone() (the child's clone()); null stays null.
inline MaterialPtr copyChild(const MaterialPtr& child, bool newName) {
    if (!child) return MaterialPtr();
    return newName ? child->duplicate() : child->clone();
}

// ---- XML -------------------------------------------------------------------------

// A step below an Asset's url: a slot's word or a material's name.
inline std::u16string childUrl(const std::u16string& url, const std::u16string& step) {
    return url + u"/" + step;
}

// The Assets of a texture slot, if the slot holds a texture.
inline void writeTextureAssets(AssetXmlWriter& writer, const TexturePtr& texture,
                               const std::u16string& slotUrl) {
    if (texture) texture->writeXml(writer, slotUrl);
}

// A `plugin` parameter that refers to a child material: the value is `url`,
// "/" and the child's name; an absent child gives the parameter without value.
inline void writeMaterialRef(AssetXmlWriter& writer, const WriterText& name, const MaterialPtr& child,
                             const std::u16string& url) {
    writer.writePluginRef(name, child.get(), url);
}

// A `plugin` parameter that refers to a texture under its slot url.
inline void writeTextureRef(AssetXmlWriter& writer, const WriterText& name, const TexturePtr& texture,
                            const std::u16string& slotUrl) {
    writer.writePluginRef(name, texture.get(), slotUrl);
}

// The head of a material's own Asset: openAsset (asset type "material"),
// openPlugin and openParameters.
inline void openMaterialAsset(AssetXmlWriter& writer, const BaseMaterial& material,
                              const std::u16string& url, const WriterText& layout) {
    openPluginAsset(writer, url, material.getAssetType(), material.getPluginName(), layout);
}

inline void closeMaterialAsset(AssetXmlWriter& writer) { closePluginAsset(writer); }

}  // namespace OrvaneLumoCore
