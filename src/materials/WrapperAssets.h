#pragma once
// The wrapping materials in the asset conversion of a material file. The
// conversion frame (MaterialAssets) calls these pieces:
// - the search through wrapping materials for the layered material inside;
// - the folded wrappers: bump, displacement, environment override, object
//   exclusion and alpha contribution lend their textures and settings to the
//   one flat main Asset;
// - the top-level branches of the classes that keep a plugin of their own:
//   angle blend and both two-sided classes (two children), and toon.
#include <cstdint>
#include <string>
#include <vector>

#include "materials/BaseMaterial.h"

class AssetXmlWriter;

namespace OrvaneLumoCore {

// The children that findMaterialsOfType descends into, in search order: the
// one child, front then back, mtl_one then mtl_two; for a reference the scene
// table's material of its target UUID, or, if the table has none, its
// embedded copy. Empty for the classes that end the search.
std::vector<MaterialPtr> wrapperSearchChildren(const BaseMaterial& material);

// A wrapping material whose settings the main Asset of its tree takes over.
// Only the first of each type in the tree counts.
struct FoldedWrapper {
    std::uint32_t tag;
    // Writes the Assets of the wrapper's present textures, each under the
    // main Asset's `url`, "/" and the slot word.
    void (*writeTextures)(AssetXmlWriter& writer, const BaseMaterial& wrapper, const std::u16string& url);
    // Writes the wrapper's parameters into the main Asset whose url is `url`.
    void (*writeParameters)(AssetXmlWriter& writer, const BaseMaterial& wrapper, const std::u16string& url);
};

// The folded wrappers, in the order in which their textures and parameters
// go out.
const std::vector<FoldedWrapper>& foldedWrappers();

// An angle blend or two-sided material at the top of a file: the flat Assets
// of both children, then its own Asset, whose layout names its class.
void writeTwoChildAssets(AssetXmlWriter& writer, const MaterialPtr& material);

// A toon material at the top of a file: the flat Asset of its base material,
// the line textures, then the toon Asset ("ToonMatLayout"). Writes nothing
// without a base material.
void writeToonAssets(AssetXmlWriter& writer, const MaterialPtr& material);

// What writeMaterialAssets writes for `material`, through a fresh writer and
// with no root element.
std::u16string materialToXml(const MaterialPtr& material);

}  // namespace OrvaneLumoCore
