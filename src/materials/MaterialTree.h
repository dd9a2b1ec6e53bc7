#pragma once
// Walks over a material's tree for callers outside the conversion: the
// direct children of a material, the parent of a child, the bitmap files of a
// whole tree, and whether a material can stand in a plugin reference.
#include <cstddef>
#include <cstdint>
#include <string>
#include <vector>

#include "materials/BaseMaterial.h"
#include "textures/BaseTexture.h"

namespace OrvaneLumoCore {

// The child materials a material holds, in the order of its fields (for a
// MaterialReference its embedded copy, for a MaterialMulti its
// sub-materials). Empty slots are left out; an instance's material is no
// child.
std::vector<MaterialPtr> childMaterials(const BaseMaterial& material);

// True for the classes that wrap one material (bump, linked, environment
// override, displaced, object exclusion, alpha contribution, toon): the
// searches through a tree go down through them.
bool isSingleChildWrapper(std::uint32_t type);

// False for an empty pointer; for a MaterialReference true if its target UUID
// isn't empty; true for any other material.
bool isUsableMaterial(const MaterialPtr& material);

// The wrapping material inside `root` whose one or first child is `child`
// (the same object), or empty. Only the first child is searched: the second
// child of an angle blend isn't, and two-sided materials and references end
// the search with an empty result.
MaterialPtr findParentMaterial(const MaterialPtr& child, const MaterialPtr& root);

// Appends the file paths of the bitmaps in the tree to `files` and returns
// its new length. References are followed through the scene table.
std::size_t collectBitmapFiles(const MaterialPtr& material, std::vector<std::u16string>& files);

// Appends the file paths of the bitmaps below a texture (itself included).
void collectTextureBitmapFiles(const TexturePtr& texture, std::vector<std::u16string>& files);

}  // namespace OrvaneLumoCore
