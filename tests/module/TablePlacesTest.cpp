// The places that record tables give their parameters: within one Asset, or one block of the options document, no two
// parameters claim the same place. Where two did, their order in the XML would hang on the order of the table's rows,
// which record order decides.
#include <gtest/gtest.h>

#include <map>
#include <string>
#include <utility>

#include "animation/Camera.h"
#include "lights/LocalLights.h"
#include "lights/SunIesDome.h"
#include "materials/ToonMaterial.h"
#include "materials/TwoSidedBump.h"
#include "materials/WrappingMaterials.h"
#include "options/AllOptions.h"
#include "options/DocumentBlocks.h"
#include "options/OptionRecords.h"
#include "textures/Bitmaps.h"

using namespace OrvaneLumoCore;

namespace {

// Who holds each (block, place): "table parameter". Block 0 is the class's own Asset.
typedef std::map<std::pair<int, int>, std::string> Places;

// The parameters of the class's own Asset, or those of the document's blocks.
enum class Shown { Own, InBlocks };

template <class C>
void claim(Places& places, const std::string& table, RowSpan<RecordRow<C>> rows, Shown shown = Shown::Own) {
    for (const RecordRow<C>& row : rows) {
        if (!row.xml.name || row.xml.at == 0 || (row.xml.group != 0) != (shown == Shown::InBlocks)) continue;
        const std::string who = table + " " + row.xml.name;
        const auto made = places.emplace(std::make_pair(row.xml.group, row.xml.at), who);
        EXPECT_TRUE(made.second) << who << " takes place " << row.xml.at << " of block " << row.xml.group
                                 << " from " << made.first->second;
    }
}

template <class C>
void ownPlaces(const std::string& table) {
    Places places;
    claim(places, table, C::record());
}

TEST(TablePlaces, NoTwoParametersOfAnAssetShareAPlace) {
    ownPlaces<OmniLight>("omni");
    ownPlaces<SpotLight>("spot");
    ownPlaces<RectangleLight>("rectangle");
    ownPlaces<IESLight>("ies");
    ownPlaces<BitmapBuffer>("bitmap buffer");
    ownPlaces<MaterialToon>("toon");
    ownPlaces<Material2Sided>("two-sided");
    ownPlaces<MaterialSkp2Sided>("two-sided (SketchUp)");
    ownPlaces<MaterialOverrideEnvironment>("override environment");
    ownPlaces<MaterialDisplaced>("displaced");
    ownPlaces<MaterialAngleBlend>("angle blend");
    ownPlaces<MaterialAlphaContribution>("alpha contribution");
    ownPlaces<OrvaneFrameData>("frame data");
    ownPlaces<PhysicalCamera>("camera");
}

// The document's blocks gather their parameters from four tables, so a place is taken once across all four.
TEST(TablePlaces, NoTwoParametersOfADocumentBlockShareAPlace) {
    Places places;
    claim(places, "document", AllOptions::record(), Shown::InBlocks);
    claim(places, "params", OrvaneParams::record(), Shown::InBlocks);
    claim(places, "frame data", OrvaneFrameData::record(), Shown::InBlocks);
    claim(places, "camera", PhysicalCamera::record(), Shown::InBlocks);
    int blocks = 0;
    for (const auto& place : places) blocks += place.first.second == 1;
    EXPECT_EQ(blocks, block::kCount) << "every block has a first parameter";
}

}  // namespace
