// Fresnel, blend, invert and constant textures: records of every version,
// copies, comparisons and their exact XML.
#include <gtest/gtest.h>

#include "persistence/Record.h"
#include "textures/BasicTextures.h"
#include "textures/Bitmaps.h"
#include "TextureTestUtil.h"

using namespace OrvaneLumoCore;
using textest::Bytes;
using textest::savedBytes;
using textest::xmlOf;

namespace {

// An AColorTexture record: version 1, then the acolor.
Bytes acolorRecord(float r, float g, float b, float a) {
    return Bytes().version(1).floats({r, g, b, a});
}

boost::shared_ptr<AColorTexture> acolor(float r, float g, float b, float a) {
    return boost::shared_ptr<AColorTexture>(new AColorTexture(AColor(r, g, b, a)));
}

template <class T>
boost::shared_ptr<T> loaded(const Bytes& bytes, bool expectOk = true) {
    boost::shared_ptr<T> t(new T());
    QuickArchive ar = bytes.archive();
    EXPECT_EQ(expectOk, t->load(ar));
    return t;
}

const AColorTexture* asAColor(const TexturePtr& t) {
    return dynamic_cast<const AColorTexture*>(t.get());
}

}  // namespace

// ---- records -------------------------------------------------------------------------

TEST(FresnelRecord, Version1HoldsColoursAndIorsOnly) {
    // Version 1: whiteInverse, blackInverse, fresnel_ior, refract_ior.
    const Bytes v1 = Bytes().version(1).floats({0.1f, 0.2f, 0.3f}).floats({0.4f, 0.5f, 0.6f})
                         .f32(1.3f).f32(1.7f);
    auto t = loaded<FresnelTexture>(v1);
    EXPECT_EQ(Color(0.1f, 0.2f, 0.3f), t->whiteInverse);
    EXPECT_EQ(Color(0.4f, 0.5f, 0.6f), t->blackInverse);
    EXPECT_EQ(1.3f, t->fresnel_ior);
    EXPECT_EQ(1.7f, t->refract_ior);
    EXPECT_EQ(1.0f, t->black_color_tex_mult);
    EXPECT_EQ(1.0f, t->white_color_tex_mult);
    EXPECT_EQ(1.0f, t->fresnel_ior_tex_mult);
    EXPECT_EQ(1.0f, t->refract_ior_tex_mult);
    EXPECT_FALSE(t->reflection_tex || t->refraction_tex || t->fresnel_ior_tex || t->refract_ior_tex);
}

TEST(FresnelRecord, Version2ReadsAndWritesTheSameBytes) {
    // Version 2: the colours and iors, four multipliers, four optional children.
    const Bytes v2 = Bytes().version(2).floats({0.1f, 0.2f, 0.3f}).floats({0.4f, 0.5f, 0.6f})
                         .f32(1.3f).f32(1.7f)
                         .floats({2, 3, 4, 5})
                         .u8(0)
                         .u8(1).i32(5).append(acolorRecord(0.5f, 0.25f, 0, 1))
                         .u8(0)
                         .u8(1).i32(5).append(acolorRecord(1, 1, 0, 0));
    auto t = loaded<FresnelTexture>(v2);
    EXPECT_EQ(2.0f, t->black_color_tex_mult);
    EXPECT_EQ(3.0f, t->white_color_tex_mult);
    EXPECT_EQ(4.0f, t->fresnel_ior_tex_mult);
    EXPECT_EQ(5.0f, t->refract_ior_tex_mult);
    EXPECT_FALSE(t->reflection_tex);
    ASSERT_TRUE(asAColor(t->refraction_tex));
    EXPECT_EQ(AColor(0.5f, 0.25f, 0, 1), asAColor(t->refraction_tex)->color);
    EXPECT_FALSE(t->fresnel_ior_tex);
    ASSERT_TRUE(asAColor(t->refract_ior_tex));
    EXPECT_EQ(v2.data, savedBytes(*t));
}

TEST(BlendRecord, Version1HasNoMultipliers) {
    // Version 1: color_a optional child, color_b optional child, blend_amount.
    const Bytes v1 = Bytes().version(1)
                         .u8(1).i32(5).append(acolorRecord(1, 0, 0, 1))
                         .u8(1).i32(5).append(acolorRecord(0, 1, 0, 1))
                         .f32(0.75f);
    auto t = loaded<BlendTexture>(v1);
    ASSERT_TRUE(asAColor(t->color_a) && asAColor(t->color_b));
    EXPECT_EQ(AColor(0, 1, 0, 1), asAColor(t->color_b)->color);
    EXPECT_EQ(1.0f, t->colorAMult);
    EXPECT_EQ(1.0f, t->colorBMult);
    EXPECT_EQ(0.75f, t->blend_amount);
}

TEST(BlendRecord, Version2MultiplierStandsOnlyBehindAPresentChild) {
    // Version 2: color_a absent (no multiplier), color_b present with its
    // multiplier behind its record, blend_amount.
    const Bytes v2 = Bytes().version(2)
                         .u8(0)
                         .u8(1).i32(5).append(acolorRecord(0, 0, 1, 1)).f32(0.25f)
                         .f32(0.125f);
    auto t = loaded<BlendTexture>(v2);
    EXPECT_FALSE(t->color_a);
    EXPECT_EQ(1.0f, t->colorAMult);
    ASSERT_TRUE(asAColor(t->color_b));
    EXPECT_EQ(0.25f, t->colorBMult);
    EXPECT_EQ(0.125f, t->blend_amount);
    EXPECT_EQ(v2.data, savedBytes(*t));
}

TEST(BlendRecord, SaveDropsTheMultiplierOfAnAbsentChild) {
    BlendTexture t;
    t.colorAMult = 7;  // not stored: color_a is absent
    t.color_b = acolor(0, 0, 0, 1);
    t.colorBMult = 3;
    const Bytes expected = Bytes().version(2).u8(0)
                               .u8(1).i32(5).append(acolorRecord(0, 0, 0, 1)).f32(3)
                               .f32(0.5f);
    EXPECT_EQ(expected.data, savedBytes(t));
}

TEST(InvertRecord, RequiredChildAndFlag) {
    // Version 1: texture as tag and record (no flag), invert_alpha.
    const Bytes v1 = Bytes().version(1).i32(5).append(acolorRecord(1, 0.5f, 0, 1)).u8(1);
    auto t = loaded<InvertTexture>(v1);
    ASSERT_TRUE(asAColor(t->texture));
    EXPECT_TRUE(t->invert_alpha);
    EXPECT_EQ(v1.data, savedBytes(*t));
}

TEST(InvertRecord, SaveWithoutChildFailsAndWritesNothing) {
    InvertTexture t;
    bool ok = true;
    EXPECT_TRUE(savedBytes(t, &ok).empty());
    EXPECT_FALSE(ok);
}

TEST(AColorRecord, Version1) {
    const Bytes v1 = acolorRecord(0.25f, 0.5f, 0.75f, 0.125f);
    auto t = loaded<AColorTexture>(v1);
    EXPECT_EQ(AColor(0.25f, 0.5f, 0.75f, 0.125f), t->color);
    EXPECT_EQ(v1.data, savedBytes(*t));
}

TEST(BasicRecords, LoadStartsFromTheDefaults) {
    // A Fresnel texture with children and changed values, loaded over with a
    // version-1 record, keeps nothing of its earlier state.
    FresnelTexture t;
    t.reflection_tex = acolor(1, 1, 1, 1);
    t.refract_ior_tex_mult = 9;
    QuickArchive ar = Bytes().version(1).floats({0, 0, 0, 0, 0, 0, 1, 1}).archive();
    ASSERT_TRUE(t.load(ar));
    EXPECT_FALSE(t.reflection_tex);
    EXPECT_EQ(1.0f, t.refract_ior_tex_mult);
}

// ---- clone and isEqual ---------------------------------------------------------------

TEST(BasicCopies, CloneIsDeepAndEqual) {
    boost::shared_ptr<BlendTexture> blend(new BlendTexture());
    blend->color_a = acolor(1, 0, 0, 1);
    blend->blend_amount = 0.3f;
    boost::shared_ptr<InvertTexture> invert(new InvertTexture());
    invert->texture = blend;
    invert->invert_alpha = true;

    TexturePtr copy = invert->clone();
    ASSERT_TRUE(copy);
    EXPECT_TRUE(invert->isEqual(copy));
    EXPECT_TRUE(copy->isEqual(invert));
    auto* c = dynamic_cast<InvertTexture*>(copy.get());
    ASSERT_TRUE(c);
    EXPECT_NE(c->texture.get(), invert->texture.get());
    auto* cb = dynamic_cast<BlendTexture*>(c->texture.get());
    ASSERT_TRUE(cb);
    EXPECT_NE(cb->color_a.get(), blend->color_a.get());

    // A change deep in the copy is seen by the comparison of the roots.
    dynamic_cast<AColorTexture&>(*cb->color_a).color.a = 0.5f;
    EXPECT_FALSE(invert->isEqual(copy));
}

TEST(BasicCopies, IsEqualTellsEachDifference) {
    typedef void (*Change)(FresnelTexture&);
    const Change changes[] = {
        [](FresnelTexture& t) { t.whiteInverse.g = 0.5f; },
        [](FresnelTexture& t) { t.blackInverse.b = 0.5f; },
        [](FresnelTexture& t) { t.fresnel_ior = 2; },
        [](FresnelTexture& t) { t.refract_ior = 2; },
        [](FresnelTexture& t) { t.black_color_tex_mult = 2; },
        [](FresnelTexture& t) { t.white_color_tex_mult = 2; },
        [](FresnelTexture& t) { t.fresnel_ior_tex_mult = 2; },
        [](FresnelTexture& t) { t.refract_ior_tex_mult = 2; },
        [](FresnelTexture& t) { t.reflection_tex = acolor(1, 1, 1, 1); },
        [](FresnelTexture& t) { t.refraction_tex = acolor(1, 1, 1, 1); },
        [](FresnelTexture& t) { t.fresnel_ior_tex = acolor(1, 1, 1, 1); },
        [](FresnelTexture& t) { t.refract_ior_tex = acolor(1, 1, 1, 1); },
    };
    const TexturePtr base(new FresnelTexture());
    for (std::size_t i = 0; i < sizeof changes / sizeof changes[0]; ++i) {
        boost::shared_ptr<FresnelTexture> other(new FresnelTexture());
        changes[i](*other);
        EXPECT_FALSE(base->isEqual(other)) << "change " << i;
        EXPECT_FALSE(other->isEqual(base)) << "change " << i;
    }
    EXPECT_TRUE(base->isEqual(TexturePtr(new FresnelTexture())));
    EXPECT_FALSE(base->isEqual(TexturePtr()));
    EXPECT_FALSE(base->isEqual(TexturePtr(new BlendTexture())));
}

// ---- XML -------------------------------------------------------------------------------

TEST(BasicXml, FresnelWithDefaults) {
    FresnelTexture t;
    const char* expected =
R"(  <Asset layout="" renderer="lumo" type="texture" url="/M/TexFresnel" >
    <plugin>
      <lumoplugin name="TexFresnel" type="texture">
        <parameters>
          <parameter type="color" name="white_color" handler="default" listType="none" label="white_color">
            <value>
              <r>0</r>
              <g>0</g>
              <b>0</b>
            </value>
          </parameter>
          <parameter type="color" name="black_color" handler="default" listType="none" label="black_color">
            <value>
              <r>0.745098</r>
              <g>0.745098</g>
              <b>0.745098</b>
            </value>
          </parameter>
          <parameter type="float" name="fresnel_ior" handler="default" listType="none" label="fresnel_ior">
            <value>1.55</value>
          </parameter>
          <parameter type="float" name="refract_ior" handler="default" listType="none" label="refract_ior">
            <value>1.55</value>
          </parameter>
          <parameter type="float" name="black_color_tex_mult" handler="default" listType="none" label="black_color_tex_mult">
            <value>1</value>
          </parameter>
          <parameter type="float" name="white_color_tex_mult" handler="default" listType="none" label="white_color_tex_mult">
            <value>1</value>
          </parameter>
          <parameter type="float" name="fresnel_ior_tex_mult" handler="default" listType="none" label="fresnel_ior_tex_mult">
            <value>1</value>
          </parameter>
          <parameter type="float" name="refract_ior_tex_mult" handler="default" listType="none" label="refract_ior_tex_mult">
            <value>1</value>
          </parameter>
          <parameter type="plugin" name="black_color_tex" handler="default" listType="none" label="black_color_tex">
          </parameter>
          <parameter type="plugin" name="white_color_tex" handler="default" listType="none" label="white_color_tex">
          </parameter>
          <parameter type="plugin" name="fresnel_ior_tex" handler="default" listType="none" label="fresnel_ior_tex">
          </parameter>
          <parameter type="plugin" name="refract_ior_tex" handler="default" listType="none" label="refract_ior_tex">
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    EXPECT_EQ(expected, xmlOf(t, u"/M"));
}

TEST(BasicXml, FresnelSlotsCrossOverAndColoursClampAtZero) {
    FresnelTexture t;
    t.whiteInverse = Color(1.5f, 0.25f, -1.0f);  // complements: 0 (not -0.5), 0.75, 2
    t.reflection_tex = acolor(1, 0, 0, 1);
    t.refraction_tex = acolor(0, 1, 0, 1);
    const std::string xml = xmlOf(t, u"/M");

    // The children's Assets come first, in slot order.
    const std::size_t refl = xml.find(R"(url="/M/TexFresnel/reflection_tex/TexAColor" >)");
    const std::size_t refr = xml.find(R"(url="/M/TexFresnel/refraction_tex/TexAColor" >)");
    const std::size_t own = xml.find(R"(url="/M/TexFresnel" >)");
    ASSERT_NE(std::string::npos, refl);
    ASSERT_NE(std::string::npos, refr);
    ASSERT_NE(std::string::npos, own);
    EXPECT_LT(refl, refr);
    EXPECT_LT(refr, own);

    EXPECT_NE(std::string::npos,
              xml.find("label=\"white_color\">\n"
                       "            <value>\n"
                       "              <r>0</r>\n"
                       "              <g>0.75</g>\n"
                       "              <b>2</b>\n"));
    EXPECT_NE(std::string::npos,
              xml.find("label=\"black_color_tex\">\n"
                       "            <value>/M/TexFresnel/reflection_tex/TexAColor</value>\n"));
    EXPECT_NE(std::string::npos,
              xml.find("label=\"white_color_tex\">\n"
                       "            <value>/M/TexFresnel/refraction_tex/TexAColor</value>\n"));
}

TEST(BasicXml, BlendWithOneChild) {
    BlendTexture t;
    t.color_b = acolor(0.5f, 1, 1e6f, 0.0001f);
    t.colorBMult = 4;  // the multipliers don't reach the XML
    t.blend_amount = 0.25f;
    const char* expected =
R"(  <Asset layout="" renderer="lumo" type="texture" url="/A&amp;B/TexBlend/color_b/TexAColor" >
    <plugin>
      <lumoplugin name="TexAColor" type="texture">
        <parameters>
          <parameter type="acolor" name="texture" handler="default" listType="none" label="texture">
            <value>
              <r>0.5</r>
              <g>1</g>
              <b>1e+006</b>
              <a>0.0001</a>
            </value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
  <Asset layout="" renderer="lumo" type="texture" url="/A&amp;B/TexBlend" >
    <plugin>
      <lumoplugin name="TexBlend" type="texture">
        <parameters>
          <parameter type="plugin" name="color_a" handler="default" listType="none" label="color_a">
          </parameter>
          <parameter type="plugin" name="color_b" handler="default" listType="none" label="color_b">
            <value>/A&amp;B/TexBlend/color_b/TexAColor</value>
          </parameter>
          <parameter type="float" name="blend_amount" handler="default" listType="none" label="blend_amount">
            <value>0.25</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    EXPECT_EQ(expected, xmlOf(t, u"/A&B"));
}

TEST(BasicXml, InvertUsesTheSlotBaseTexture) {
    InvertTexture t;
    t.texture = acolor(1, 1, 1, 1);
    t.invert_alpha = true;
    const std::string xml = xmlOf(t, u"/M");
    const std::string tail =
R"(  <Asset layout="" renderer="lumo" type="texture" url="/M/TexInvert" >
    <plugin>
      <lumoplugin name="TexInvert" type="texture">
        <parameters>
          <parameter type="plugin" name="texture" handler="default" listType="none" label="texture">
            <value>/M/TexInvert/base_texture/TexAColor</value>
          </parameter>
          <parameter type="bool" name="invert_alpha" handler="default" listType="none" label="invert_alpha">
            <value>1</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    ASSERT_GT(xml.size(), tail.size());
    EXPECT_EQ(tail, xml.substr(xml.size() - tail.size()));
    EXPECT_EQ(0u, xml.find(R"(  <Asset layout="" renderer="lumo" type="texture" url="/M/TexInvert/base_texture/TexAColor" >)"));
}

TEST(BasicXml, SharedChildIsWrittenOncePerOwner) {
    TexturePtr shared = acolor(1, 1, 1, 1);
    BlendTexture t;
    t.color_a = shared;
    t.color_b = shared;
    const std::string xml = xmlOf(t, u"/M");
    EXPECT_NE(std::string::npos, xml.find(R"(url="/M/TexBlend/color_a/TexAColor" >)"));
    EXPECT_NE(std::string::npos, xml.find(R"(url="/M/TexBlend/color_b/TexAColor" >)"));
}
