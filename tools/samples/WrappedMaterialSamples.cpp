// Material libraries of wrapped trees: wrapping, two-sided, reference and
// toon materials around layered ones, written by the library's own save, and
// old records of the wrapping classes laid by hand.
#include <cstdint>
#include <vector>

#include "SampleParts.h"
#include "Samples.h"
#include "materials/Brdf.h"
#include "materials/LayeredMaterials.h"
#include "materials/ReferenceMaterials.h"
#include "materials/SceneMaterials.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "module/OrvMatFile.h"
#include "persistence/QuickArchive.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"

using namespace OrvaneLumoCore;

namespace samples {

namespace {

boost::shared_ptr<MaterialLayeredBRDF> layered(const char16_t* name, const char16_t* layerName,
                                               const Color& color) {
    boost::shared_ptr<MaterialLayeredBRDF> m(new MaterialLayeredBRDF);
    m->name = name;
    boost::shared_ptr<Diffuse_BRDF> layer(new Diffuse_BRDF);
    layer->name = layerName;
    layer->color = color;
    m->brdfs.push_back(layer);
    return m;
}

// Wall:  a bump over a two-sided material over two layered materials;
// Ref:   a reference with its embedded copy of Stone;
// Ink:   a toon material over a layered material, with a line texture;
// Outer: an angle blend whose first child is another angle blend.
bool writeWrappedTrees(const std::string& path) {
    OrvMatFile file;

    boost::shared_ptr<Material2Sided> sheet(new Material2Sided);
    sheet->name = u"Sheet";
    sheet->front = layered(u"Front", u"Face", Color(0.8f, 0.7f, 0.6f));
    sheet->back = layered(u"Back", u"Paint", Color(0.2f, 0.3f, 0.8f));
    sheet->translucency = Color(0.1f, 0.2f, 0.3f);
    boost::shared_ptr<MaterialBump> wall(new MaterialBump);
    wall->name = u"Wall";
    wall->base_mtl = sheet;
    wall->bump_tex = makeBitmapTextureFromPath(u"textures/plaster_bump.png");
    wall->bump_tex_mult = 0.5f;
    file.materials.push_back(wall);

    // A reference embeds the scene table's material of its target UUID when
    // it is saved, so the target stands in the table for the save.
    boost::shared_ptr<MaterialLayeredBRDF> stone = layered(u"Stone", u"Grain", Color(0.5f, 0.5f, 0.45f));
    stone->uuid = u"5a1e0000-0000-4000-8000-000000000001";
    boost::shared_ptr<SceneMaterials> table = SceneMaterials::instance();
    table->addMaterial(stone);
    boost::shared_ptr<MaterialReference> ref(new MaterialReference);
    ref->name = u"Ref";
    ref->target_uuid = stone->uuid;
    file.materials.push_back(ref);

    boost::shared_ptr<MaterialToon> ink(new MaterialToon);
    ink->name = u"Ink";
    ink->base_mtl = layered(u"Paper", u"Fiber", Color(0.95f, 0.95f, 0.9f));
    ink->lineColorTex = constantColor(0.1f, 0.1f, 0.1f);
    ink->lineColor = Color(0.2f, 0.4f, 0.6f);
    ink->lineWidth = 2;
    file.materials.push_back(ink);

    boost::shared_ptr<MaterialAngleBlend> inner(new MaterialAngleBlend);
    inner->name = u"Inner";
    inner->mtl_one = layered(u"Red", u"R", Color(1, 0, 0));
    inner->mtl_two = layered(u"Blue", u"B", Color(0, 0, 1));
    boost::shared_ptr<MaterialAngleBlend> outer(new MaterialAngleBlend);
    outer->name = u"Outer";
    outer->mtl_one = inner;
    outer->mtl_two = layered(u"Green", u"G", Color(0, 1, 0));
    outer->start_angle = 30;
    outer->stop_angle = 120;
    file.materials.push_back(outer);

    const bool ok = file.save(utf8ToWide(path));
    table->removeMaterial(stone->name);
    return ok;
}

// The five folded wrappers in one tree, with their textures, and the
// classes that keep a plugin of their own at the top.
bool writeFoldedWrappers(const std::string& path) {
    boost::shared_ptr<MaterialAlphaContribution> alpha(new MaterialAlphaContribution);
    alpha->name = u"AlphaPart";
    alpha->base_mtl = layered(u"Core", u"Base", Color(0.4f, 0.4f, 0.4f));
    alpha->alpha = 0.5f;
    boost::shared_ptr<MaterialObjectExclusion> exclusion(new MaterialObjectExclusion);
    exclusion->name = u"Excluding";
    exclusion->base_mtl = alpha;
    exclusion->mode = 1;
    exclusion->objects = {u"Chair", u"Table"};
    boost::shared_ptr<MaterialOverrideEnvironment> env(new MaterialOverrideEnvironment);
    env->name = u"Env";
    env->base_mtl = exclusion;
    env->gi_tex = constantColor(0.2f, 0.25f, 0.3f);
    env->reflect_color = Color(0.9f, 0.9f, 1);
    env->override_gi = true;
    env->override_reflect = true;
    boost::shared_ptr<MaterialDisplaced> displaced(new MaterialDisplaced);
    displaced->name = u"Displaced";
    displaced->base_mtl = env;
    displaced->displace_tex = makeBitmapTextureFromPath(u"textures/height.png");
    displaced->displace_shift = -0.1f;
    boost::shared_ptr<MaterialBump> bump(new MaterialBump);
    bump->name = u"Folded";
    bump->base_mtl = displaced;
    bump->bump_tex = constantColor(0.5f, 0.5f, 0.5f);

    boost::shared_ptr<MaterialSkp2Sided> skp(new MaterialSkp2Sided);
    skp->name = u"SkpSheet";
    skp->front = layered(u"SkpFront", u"Base", Color(0.7f, 0.7f, 0.7f));
    skp->force_1sided = true;

    boost::shared_ptr<MaterialLinked> linked(new MaterialLinked);
    linked->name = u"LinkedWood";
    linked->id.kind = 1;
    linked->id.text = u"node-17";
    linked->linked_material = layered(u"Wood", u"Grain", Color(0.6f, 0.4f, 0.2f));

    OrvMatFile file;
    file.materials = {bump, skp, linked};
    return file.save(utf8ToWide(path));
}

// Old records of the wrapping classes, version 2 container.
bool writeOldWrapperRecords(const std::string& path) {
    QuickArchive ar;
    auto layeredRecord = [&ar](const char16_t* name) {
        // MaterialLayeredBRDF version 3: no layers, four integers, base record.
        ar.writeUInt(0x30000);
        ar.writeLength(0);
        ar.writeInt(1);
        ar.writeInt(0);
        ar.writeInt(1);
        ar.writeInt(1);
        ar.writeUInt(0x20000);
        ar.writeWString(name);
        ar.writeWString(u"");
    };

    // MaterialBump version 1: inline name, a bitmap path, bump_tex_mult,
    // base_mtl as tag and record.
    ar.writeInt(kMaterialBump);
    ar.writeUInt(0x10000);
    ar.writeWString(u"OldBump");
    ar.writeWString(u"textures/old_bump.png");
    ar.writeFloat(0.75f);
    ar.writeUInt(kMaterialLayeredBRDF);
    layeredRecord(u"OldBumpBase");

    // Material2Sided version 1: front, back, translucency_tex,
    // translucency, translucency_tex_mult, force_1sided; no name.
    ar.writeInt(kMaterial2Sided);
    ar.writeUInt(0x10000);
    ar.writeByte(true);
    ar.writeUInt(kMaterialLayeredBRDF);
    layeredRecord(u"OldFront");
    ar.writeByte(false);
    ar.writeByte(false);
    ar.writeColor(Color(0.3f, 0.3f, 0.3f));
    ar.writeFloat(1);
    ar.writeByte(false);

    // MaterialObjectExclusion version 1: mode, base_mtl, object names; no
    // name.
    ar.writeInt(kMaterialObjectExclusion);
    ar.writeUInt(0x10000);
    ar.writeInt(1);
    ar.writeByte(true);
    ar.writeUInt(kMaterialLayeredBRDF);
    layeredRecord(u"OldExcluded");
    ar.writeLength(1);
    ar.writeWString(u"Lamp");

    // MaterialDisplaced version 1: base record, base_mtl, displace_tex,
    // displace_tex_mult.
    ar.writeInt(kMaterialDisplaced);
    ar.writeUInt(0x10000);
    ar.writeUInt(0x20000);
    ar.writeWString(u"OldDisplaced");
    ar.writeWString(u"");
    ar.writeByte(true);
    ar.writeUInt(kMaterialLayeredBRDF);
    layeredRecord(u"OldDisplacedBase");
    ar.writeByte(false);
    ar.writeFloat(2);

    // MaterialToon version 1: rows 1 to 13, without the silhouette fields.
    ar.writeInt(kMaterialToon);
    ar.writeUInt(0x10000);
    ar.writeByte(true);
    ar.writeUInt(kMaterialLayeredBRDF);
    layeredRecord(u"OldToonBase");
    ar.writeFloat(1.5f);
    ar.writeFloat(1);
    ar.writeByte(false);
    ar.writeFloat(1);
    ar.writeFloat(1);
    ar.writeByte(false);
    ar.writeFloat(0);
    ar.writeFloat(1);
    ar.writeByte(false);
    ar.writeColor(Color(0, 0, 0));
    ar.writeFloat(1);
    ar.writeByte(false);
    ar.writeFloat(0.95f);
    ar.writeFloat(0.02f);
    ar.writeFloat(0.7f);
    ar.writeFloat(1);
    ar.writeByte(true);
    ar.writeByte(false);
    ar.writeUInt(0x20000);
    ar.writeWString(u"OldToon");
    ar.writeWString(u"");

    return writeOldContainer(path, 2, 5, ar);
}

}  // namespace

void addWrappedMaterialSamples(std::vector<Sample>& list) {
    list.push_back({"materials_wrapped_trees.orvmat", &writeWrappedTrees});
    list.push_back({"materials_folded_wrappers.orvmat", &writeFoldedWrappers});
    list.push_back({"materials_old_wrapper_records.orvmat", &writeOldWrapperRecords});
}

}  // namespace samples
