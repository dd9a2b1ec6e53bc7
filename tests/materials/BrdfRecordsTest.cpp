// Records of the six BRDF layers: every version laid by hand, comparison, copies, damaged data.
#include "materials/RecordLists.h"

using namespace mattest;

namespace {

// The flags and the numbers that no XML shows.
std::string hidden(const Base_BRDF& l) {
    std::ostringstream s;
    s << "flags " << l.layer_flag_a << l.layer_flag_b << l.layer_flag_c;
    if (auto g = dynamic_cast<const Glass_BRDF*>(&l)) s << " ior_second " << g->ior_second << " depth " << g->depth_value;
    if (auto p = dynamic_cast<const BaseGlossy_BRDF*>(&l)) s << " depth " << p->depth_value;
    if (auto m = dynamic_cast<const Mirror_BRDF*>(&l)) s << " mirror_value " << m->mirror_value;
    if (auto e = dynamic_cast<const Light_BRDF*>(&l)) s << " light_value " << e->light_value;
    return s.str();
}

TEST(LayerRecords, EveryVersionLoads) {
    // Each record loaded into a new layer and written under a url that names the record and what no XML shows: the
    // golden tells where every value landed. Blinn_BRDF reads the glossy records as Phong_BRDF does.
    auto show = [](const BrdfPtr& l, const std::string& what, const RecordBytes& bytes) {
        auto xml = [&what](const BrdfPtr& layer) { return xmlOf(*layer, utf8ToWide("/" + what + " " + hidden(*layer))); };
        EXPECT_TRUE(l->clone()->isEqual(l));  // a clone copies every field
        const BrdfPtr blinn = createBrdf(kBlinnBrdf);
        QuickArchive again = bytes.archive();
        EXPECT_TRUE(l->getType() != kPhongBrdf || (blinn->load(again) && xml(blinn) == xml(l)));
        return xml(l);
    };
    expectGolden("materials/golden/layer_records.xml", loadEach<BrdfPtr>(layerRecords(), createBrdf, show));

    // Glass resets only the base part before reading.
    Glass_BRDF used;
    used.name = u"Used", used.thickness = 7, used.layer_flag_b = true;
    QuickArchive ar = layerRecords()[0].bytes.archive();
    ASSERT_TRUE(used.load(ar));
    EXPECT_EQ(std::make_tuple(used.name, used.layer_flag_b, used.thickness), std::make_tuple(u"BRDFRefraction", false, 7.f));
}

TEST(LayerEquality, ClonesShareNothing) {
    EXPECT_FALSE(Phong_BRDF().isEqual(BrdfPtr(new Blinn_BRDF)));  // same content, other class
    typedef Glass_BRDF G;
    G g;
    g.name = u"Kept", g.layer_flag_c = true;
    g.color_tex = g.transparency_tex = g.glossiness_tex = g.ior_tex = g.translucency_tex = acolor(0, 0, 0);
    const BrdfPtr copy = g.clone();
    const G& c = static_cast<const G&>(*copy);
    EXPECT_EQ(std::make_tuple(c.name, c.layer_flag_c), std::make_tuple(u"Kept", true));
    for (TexturePtr G::*t : {&G::color_tex, &G::transparency_tex, &G::glossiness_tex, &G::ior_tex, &G::translucency_tex})
        EXPECT_NE(c.*t, g.*t);
    EXPECT_TRUE(c.isEqual(BrdfPtr(new G(g))));
    // The default Fresnel texture of a new layer: one each, cloned by clone.
    Mirror_BRDF m;
    Phong_BRDF p;
    EXPECT_NE(static_cast<Mirror_BRDF&>(*m.clone()).transparency_tex, m.transparency_tex);
    EXPECT_NE(p.transparency_tex, Phong_BRDF().transparency_tex);
    EXPECT_TRUE(p.transparency_tex->isEqual(TexturePtr(new FresnelTexture)));
    // Two owners of one texture save two copies.
    g.transparency_tex = g.glossiness_tex = g.translucency_tex = TexturePtr();
    const boost::shared_ptr<G> back = roundTrip(g);
    ASSERT_TRUE(back->color_tex && back->ior_tex);
    EXPECT_NE(back->color_tex, back->ior_tex);
    EXPECT_TRUE(back->isEqual(BrdfPtr(new G(g))));
}

TEST(LayerRecords, TagsWithoutAClassAndNames) {
    for (std::uint32_t tag : {0u, 3u, 5u, 6u, 7u, 64u, 0xFFFFFFFFu}) EXPECT_FALSE(createBrdf(tag)) << tag;
    // The base record's name loses its control characters.
    EXPECT_EQ(loaded<Diffuse_BRDF>(diffuseHead(3).b8(false).b8(false).version(1).wstr("\tLine\nFeed"))->name, u"LineFeed");
}

}  // namespace
