#include "materials/MaterialTree.h"

#include <initializer_list>

#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "persistence/Record.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "textures/ProceduralTextures.h"

namespace OrvaneLumoCore {

namespace {

template <class T>
const T* as(const BaseMaterial& material) {
    return dynamic_cast<const T*>(&material);
}

void appendPresent(std::vector<MaterialPtr>& to, std::initializer_list<MaterialPtr> children) {
    for (const MaterialPtr& child : children)
        if (child) to.push_back(child);
}

// ---- bitmap files ------------------------------------------------------------------

// The scene table can make a tree refer back to itself through a reference;
// a walk that follows the table stops at this depth.
const int kMaxWalkDepth = 4 * kMaxNestingDepth;

void collectFromTextures(std::vector<std::u16string>& files, std::initializer_list<TexturePtr> textures) {
    for (const TexturePtr& texture : textures) collectTextureBitmapFiles(texture, files);
}

void collectFromLayer(const BrdfPtr& layer, std::vector<std::u16string>& files) {
    if (!layer) return;
    if (const Glass_BRDF* glass = dynamic_cast<const Glass_BRDF*>(layer.get())) {
        collectFromTextures(files, {glass->color_tex, glass->glossiness_tex, glass->ior_tex,
                                    glass->translucency_tex, glass->transparency_tex});
    } else if (const Diffuse_BRDF* diffuse = dynamic_cast<const Diffuse_BRDF*>(layer.get())) {
        collectFromTextures(files, {diffuse->color_tex, diffuse->transparency_tex});
    } else if (const BaseGlossy_BRDF* glossy = dynamic_cast<const BaseGlossy_BRDF*>(layer.get())) {
        collectFromTextures(files, {glossy->color_tex, glossy->hilightGlossiness_tex,
                                    glossy->reflectionGlossiness_tex, glossy->transparency_tex});
    } else if (const Mirror_BRDF* mirror = dynamic_cast<const Mirror_BRDF*>(layer.get())) {
        collectFromTextures(files, {mirror->color_tex, mirror->transparency_tex});
    } else if (const Light_BRDF* light = dynamic_cast<const Light_BRDF*>(layer.get())) {
        collectFromTextures(files, {light->color_tex, light->transparency_tex});
    }
}

void collectFromMaterial(const MaterialPtr& material, std::vector<std::u16string>& files, int depth) {
    if (!material || depth > kMaxWalkDepth) return;
    const BaseMaterial& m = *material;
    auto visit = [&](const MaterialPtr& child) { collectFromMaterial(child, files, depth + 1); };
    switch (m.getType()) {
    case kMaterialLayeredBRDF:
        if (const MaterialLayeredBRDF* layered = as<MaterialLayeredBRDF>(m))
            for (const BrdfPtr& layer : layered->brdfs) collectFromLayer(layer, files);
        break;
    case kMaterialBump:
        if (const MaterialBump* bump = as<MaterialBump>(m)) {
            collectTextureBitmapFiles(bump->bump_tex, files);
            visit(bump->base_mtl);
        }
        break;
    case kMaterial2Sided:
        if (const Material2Sided* twoSided = as<Material2Sided>(m)) {
            visit(twoSided->front);
            visit(twoSided->back);
        }
        break;
    case kMaterialSkp2Sided:
        if (const MaterialSkp2Sided* twoSided = as<MaterialSkp2Sided>(m)) {
            visit(twoSided->front);
            visit(twoSided->back);
        }
        break;
    case kMaterialLinked:
        if (const MaterialLinked* linked = as<MaterialLinked>(m)) visit(linked->linked_material);
        break;
    case kMaterialOverrideEnvironment:
        if (const MaterialOverrideEnvironment* env = as<MaterialOverrideEnvironment>(m)) {
            visit(env->base_mtl);
            collectFromTextures(files, {env->bg_tex, env->gi_tex, env->reflect_tex, env->refract_tex});
        }
        break;
    case kMaterialDisplaced:
        if (const MaterialDisplaced* displaced = as<MaterialDisplaced>(m)) {
            visit(displaced->base_mtl);
            collectTextureBitmapFiles(displaced->displace_tex, files);
        }
        break;
    case kMaterialObjectExclusion:
        if (const MaterialObjectExclusion* exclusion = as<MaterialObjectExclusion>(m)) visit(exclusion->base_mtl);
        break;
    case kMaterialAlphaContribution:
        if (const MaterialAlphaContribution* alpha = as<MaterialAlphaContribution>(m)) {
            visit(alpha->base_mtl);
            collectTextureBitmapFiles(alpha->alpha_tex, files);
        }
        break;
    case kMaterialAngleBlend:
        if (const MaterialAngleBlend* blend = as<MaterialAngleBlend>(m)) {
            visit(blend->mtl_one);
            visit(blend->mtl_two);
        }
        break;
    case kMaterialReference:
        if (const MaterialReference* ref = as<MaterialReference>(m))
            visit(SceneMaterials::instance()->getMaterialByUuid(ref->target_uuid));
        break;
    case kMaterialToon:
        if (const MaterialToon* toon = as<MaterialToon>(m)) {
            visit(toon->base_mtl);
            collectFromTextures(files, {toon->opacityTex, toon->lineColorTex, toon->lineWidthTex,
                                        toon->distortTex});
        }
        break;
    default:  // single, multi and instance hold no bitmaps of their own
        break;
    }
}

// The one or first child of the classes that findParentMaterial goes
// through; false for every other class.
bool firstChildOf(const BaseMaterial& m, MaterialPtr& first) {
    if (m.getType() == kMaterialAngleBlend) {
        if (const MaterialAngleBlend* blend = as<MaterialAngleBlend>(m)) first = blend->mtl_one;
        return true;
    }
    if (!isSingleChildWrapper(m.getType())) return false;
    const std::vector<MaterialPtr> children = childMaterials(m);
    if (!children.empty()) first = children.front();
    return true;
}

}  // namespace

bool isSingleChildWrapper(std::uint32_t type) {
    switch (type) {
    case kMaterialBump:
    case kMaterialLinked:
    case kMaterialOverrideEnvironment:
    case kMaterialDisplaced:
    case kMaterialObjectExclusion:
    case kMaterialAlphaContribution:
    case kMaterialToon: return true;
    default: return false;
    }
}

std::vector<MaterialPtr> childMaterials(const BaseMaterial& m) {
    std::vector<MaterialPtr> children;
    switch (m.getType()) {
    case kMaterialMulti:
        if (const MaterialMulti* multi = as<MaterialMulti>(m))
            for (const MaterialPtr& sub : multi->materials) appendPresent(children, {sub});
        break;
    case kMaterialBump:
        if (const MaterialBump* bump = as<MaterialBump>(m)) appendPresent(children, {bump->base_mtl});
        break;
    case kMaterial2Sided:
        if (const Material2Sided* t = as<Material2Sided>(m)) appendPresent(children, {t->front, t->back});
        break;
    case kMaterialSkp2Sided:
        if (const MaterialSkp2Sided* t = as<MaterialSkp2Sided>(m)) appendPresent(children, {t->front, t->back});
        break;
    case kMaterialLinked:
        if (const MaterialLinked* linked = as<MaterialLinked>(m))
            appendPresent(children, {linked->linked_material});
        break;
    case kMaterialOverrideEnvironment:
        if (const MaterialOverrideEnvironment* w = as<MaterialOverrideEnvironment>(m))
            appendPresent(children, {w->base_mtl});
        break;
    case kMaterialDisplaced:
        if (const MaterialDisplaced* w = as<MaterialDisplaced>(m)) appendPresent(children, {w->base_mtl});
        break;
    case kMaterialObjectExclusion:
        if (const MaterialObjectExclusion* w = as<MaterialObjectExclusion>(m)) appendPresent(children, {w->base_mtl});
        break;
    case kMaterialAlphaContribution:
        if (const MaterialAlphaContribution* w = as<MaterialAlphaContribution>(m))
            appendPresent(children, {w->base_mtl});
        break;
    case kMaterialAngleBlend:
        if (const MaterialAngleBlend* w = as<MaterialAngleBlend>(m)) appendPresent(children, {w->mtl_one, w->mtl_two});
        break;
    case kMaterialReference:
        if (const MaterialReference* ref = as<MaterialReference>(m)) appendPresent(children, {ref->target});
        break;
    case kMaterialToon:
        if (const MaterialToon* toon = as<MaterialToon>(m)) appendPresent(children, {toon->base_mtl});
        break;
    default:  // layered, single and instance hold no child materials
        break;
    }
    return children;
}

bool isUsableMaterial(const MaterialPtr& material) {
    if (!material) return false;
    if (const MaterialReference* ref = as<MaterialReference>(*material)) return !ref->target_uuid.empty();
    return true;
}

MaterialPtr findParentMaterial(const MaterialPtr& child, const MaterialPtr& root) {
    if (!child) return MaterialPtr();
    // Down the chain of first children; a loop keeps deep trees off the stack.
    for (MaterialPtr node = root; node;) {
        MaterialPtr first;
        if (!firstChildOf(*node, first)) return MaterialPtr();
        if (first.get() == child.get()) return node;
        node = first;
    }
    return MaterialPtr();
}

std::size_t collectBitmapFiles(const MaterialPtr& material, std::vector<std::u16string>& files) {
    collectFromMaterial(material, files, 0);
    return files.size();
}

void collectTextureBitmapFiles(const TexturePtr& texture, std::vector<std::u16string>& files) {
    if (!texture) return;
    const BaseTexture* t = texture.get();
    if (const BitmapTexture* bitmap = dynamic_cast<const BitmapTexture*>(t)) {
        const BitmapBuffer* buffer = dynamic_cast<const BitmapBuffer*>(bitmap->bitmap.get());
        if (buffer && buffer->getType() == 0) files.push_back(buffer->file);
    } else if (const FresnelTexture* fresnel = dynamic_cast<const FresnelTexture*>(t)) {
        collectFromTextures(files, {fresnel->reflection_tex, fresnel->refraction_tex,
                                    fresnel->fresnel_ior_tex, fresnel->refract_ior_tex});
    } else if (const BlendTexture* blend = dynamic_cast<const BlendTexture*>(t)) {
        collectFromTextures(files, {blend->color_a, blend->color_b});
    } else if (const InvertTexture* invert = dynamic_cast<const InvertTexture*>(t)) {
        collectTextureBitmapFiles(invert->texture, files);
    } else if (const CheckerTexture* checker = dynamic_cast<const CheckerTexture*>(t)) {
        collectFromTextures(files, {checker->white_color, checker->black_color});
    } else if (const GridTexture* grid = dynamic_cast<const GridTexture*>(t)) {
        collectFromTextures(files, {grid->line_color, grid->fill_color});
    } else if (const NoiseTexture* noise = dynamic_cast<const NoiseTexture*>(t)) {
        collectFromTextures(files, {noise->color1_tex, noise->color2_tex});
    } else if (const RampTexture* ramp = dynamic_cast<const RampTexture*>(t)) {
        collectTextureBitmapFiles(ramp->colors, files);
    }
    // The other textures (constant, UVW, bulge, cloth, sky) hold no texture
    // and no bitmap.
}

}  // namespace OrvaneLumoCore
