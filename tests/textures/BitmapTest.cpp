// Bitmap buffers and bitmap textures: the paired-member record, the textures
// made from bare paths, and the XML.
#include <gtest/gtest.h>

#include "textures/Bitmaps.h"
#include "textures/UVWGenerators.h"
#include "TextureTestUtil.h"

using namespace OrvaneLumoCore;
using textest::Bytes;
using textest::savedBytes;
using textest::xmlOf;

namespace {

// A BitmapBuffer record: version 1, filter_type, filter_blur, gamma, file.
Bytes bufferRecord(int filterType, float blur, float gamma, const std::string& file) {
    return Bytes().version(1).i32(filterType).f32(blur).f32(gamma).wstr(file);
}

}  // namespace

TEST(BitmapRecord, BufferVersion1) {
    const Bytes v1 = bufferRecord(2, 0.5f, 2.2f, "C:\\maps\\\xC3\xA9t\xC3\xA9.png");
    BitmapBuffer b;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(b.load(ar));
    EXPECT_EQ(2, b.filter_type);
    EXPECT_EQ(0.5f, b.filter_blur);
    EXPECT_EQ(2.2f, b.gamma);
    EXPECT_EQ(u"C:\\maps\\\u00E9t\u00E9.png", b.file);
    EXPECT_EQ(v1.data, savedBytes(b));
}

TEST(BitmapRecord, BufferWithEmptyFileLoads) {
    BitmapBuffer b;
    QuickArchive ar = bufferRecord(0, 0, 1, "").archive();
    ASSERT_TRUE(b.load(ar));
    EXPECT_TRUE(b.file.empty());
    EXPECT_NE(std::string::npos,
              xmlOf(b, u"/M").find("handler=\"FileBrowserHandler\" listType=\"none\" label=\"file\">\n"
                                   "            <value></value>\n"));
}

TEST(BitmapRecord, TextureTagsStandAheadOfBothRecords) {
    // Version 1: uvw tag, bitmap tag, uvw record, bitmap record, tile.
    const Bytes v1 = Bytes().version(1).i32(0).i32(0)
                         .version(1).identityTransform().defaultComponents()
                         .append(bufferRecord(1, 0.15f, 1, "a.png"))
                         .u8(0);
    BitmapTexture t;
    QuickArchive ar = v1.archive();
    ASSERT_TRUE(t.load(ar));
    ASSERT_TRUE(t.uvw && t.bitmap);
    EXPECT_EQ(0u, t.uvw->getType());
    EXPECT_EQ(u"a.png", dynamic_cast<BitmapBuffer&>(*t.bitmap).file);
    EXPECT_FALSE(t.tile);
    EXPECT_EQ(v1.data, savedBytes(t));
}

TEST(BitmapRecord, BadChildTagsFailTheLoad) {
    struct Case {
        int uvwTag, bitmapTag;
    } cases[] = {{2, 0}, {-1, 0}, {5, 0}, {4, 1}, {4, -1}};
    for (const Case& c : cases) {
        const Bytes bytes = Bytes().version(1).i32(c.uvwTag).i32(c.bitmapTag)
                                .version(2).identityTransform().identityTransform()
                                .i32(0).i32(0).i32(1).defaultComponents().defaultComponents()
                                .append(bufferRecord(1, 0.15f, 1, "a.png")).u8(1);
        BitmapTexture t;
        QuickArchive ar = bytes.archive();
        EXPECT_FALSE(t.load(ar)) << c.uvwTag << " " << c.bitmapTag;
    }
}

TEST(BitmapRecord, SaveNeedsBothChildren) {
    for (int mask = 0; mask < 4; ++mask) {
        BitmapTexture t;
        if (mask & 1) t.uvw = createUVW(4);
        if (mask & 2) t.bitmap = createBitmap(0);
        bool ok = false;
        const bool wrote = !savedBytes(t, &ok).empty();
        EXPECT_EQ(mask == 3, ok) << mask;
        EXPECT_EQ(mask == 3, wrote) << mask;
    }
}

TEST(BitmapCopies, FileComparesWithoutCase) {
    boost::shared_ptr<BitmapBuffer> a(new BitmapBuffer()), b(new BitmapBuffer());
    a->file = u"C:\\Maps\\Wood.PNG";
    b->file = u"c:\\maps\\wood.png";
    EXPECT_TRUE(a->isEqual(b));
    b->gamma = 2.2f;
    EXPECT_FALSE(a->isEqual(b));
    b->gamma = 1;
    b->filter_blur = 0;
    EXPECT_FALSE(a->isEqual(b));
    b->filter_blur = 0.15f;
    b->filter_type = 0;
    EXPECT_FALSE(a->isEqual(b));
    b->filter_type = 1;
    b->file = u"c:\\maps\\wood2.png";
    EXPECT_FALSE(a->isEqual(b));
    EXPECT_FALSE(a->isEqual(BitmapPtr()));

    TexturePtr t = makeBitmapTextureFromPath(u"X.png");
    TexturePtr copy = t->clone();
    EXPECT_TRUE(t->isEqual(copy));
    auto& tc = dynamic_cast<BitmapTexture&>(*copy);
    EXPECT_NE(dynamic_cast<BitmapTexture&>(*t).bitmap.get(), tc.bitmap.get());
    tc.tile = false;
    EXPECT_FALSE(t->isEqual(copy));
}

TEST(BitmapFromPath, BuildsAChannelGeneratorAndABuffer) {
    EXPECT_FALSE(makeBitmapTextureFromPath(u""));
    TexturePtr t = makeBitmapTextureFromPath(u"D:\\tex\\stone.jpg");
    ASSERT_TRUE(t);
    auto* bt = dynamic_cast<BitmapTexture*>(t.get());
    ASSERT_TRUE(bt);
    EXPECT_TRUE(bt->tile);
    ASSERT_TRUE(dynamic_cast<GenChannelUVW*>(bt->uvw.get()));
    EXPECT_TRUE(bt->uvw->isEqual(createUVW(4)));
    auto* buffer = dynamic_cast<BitmapBuffer*>(bt->bitmap.get());
    ASSERT_TRUE(buffer);
    EXPECT_EQ(u"D:\\tex\\stone.jpg", buffer->file);
    EXPECT_EQ(1, buffer->filter_type);
    EXPECT_EQ(0.15f, buffer->filter_blur);
    EXPECT_EQ(1.0f, buffer->gamma);
}

TEST(BitmapXml, WholeTextureWithGeneratorAndBuffer) {
    TexturePtr t = makeBitmapTextureFromPath(u"C:\\tex\\a<b>&amp;c.png");
    auto& bt = dynamic_cast<BitmapTexture&>(*t);
    bt.tile = false;
    auto& ch = dynamic_cast<GenChannelUVW&>(*bt.uvw);
    ch.uvw_channel = 2;
    ch.texComponents.scale = Vector(2, 1, 1);
    ch.texComponents.offset = Vector(1, 2, 3.5f);
    auto& buffer = dynamic_cast<BitmapBuffer&>(*bt.bitmap);
    buffer.gamma = 2.2f;
    const char* expected =
R"(  <Asset layout="" renderer="lumo" type="uvw" url="/Wood/TexBitmap/uvwgen/UVWGenChannel" >
    <plugin>
      <lumoplugin name="UVWGenChannel" type="uvw">
        <parameters>
          <parameter type="componentTransform" name="uvw_transform" handler="default" listType="none" label="uvw_transform">
            <value>
              <x_rotation>0</x_rotation>
              <y_rotation>0</y_rotation>
              <z_rotation>0</z_rotation>
              <x_scale>1</x_scale>
              <y_scale>1</y_scale>
              <z_scale>1</z_scale>
              <x_offset>0</x_offset>
              <y_offset>0</y_offset>
              <z_offset>0</z_offset>
              <x_mirror>0</x_mirror>
              <y_mirror>0</y_mirror>
              <z_mirror>0</z_mirror>
            </value>
          </parameter>
          <parameter type="transform" name="tex_transform" handler="default" listType="none" label="tex_transform">
            <value>
              <vector>
                <x>2</x>
                <y>0</y>
                <z>0</z>
              </vector>
              <vector>
                <x>0</x>
                <y>1</y>
                <z>0</z>
              </vector>
              <vector>
                <x>0</x>
                <y>0</y>
                <z>1</z>
              </vector>
              <vector>
                <x>1</x>
                <y>2</y>
                <z>3.5</z>
              </vector>
            </value>
          </parameter>
          <parameter type="integer" name="wrap_u" handler="default" listType="none" label="wrap_u">
            <value>0</value>
          </parameter>
          <parameter type="integer" name="wrap_v" handler="default" listType="none" label="wrap_v">
            <value>0</value>
          </parameter>
          <parameter type="integer" name="uvw_channel" handler="default" listType="none" label="uvw_channel">
            <value>2</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
  <Asset layout="" renderer="lumo" type="bitmap" url="/Wood/TexBitmap/buffer/BitmapBuffer" >
    <plugin>
      <lumoplugin name="BitmapBuffer" type="bitmap">
        <parameters>
          <parameter type="integer" name="filter_type" handler="default" listType="none" label="filter_type">
            <value>1</value>
          </parameter>
          <parameter type="float" name="filter_blur" handler="default" listType="none" label="filter_blur">
            <value>0.15</value>
          </parameter>
          <parameter type="float" name="gamma" handler="default" listType="none" label="gamma">
            <value>2.2</value>
          </parameter>
          <parameter type="string" name="file" handler="FileBrowserHandler" listType="none" label="file">
            <value>C:\tex\a&lt;b&gt;&amp;c.png</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
  <Asset layout="" renderer="lumo" type="texture" url="/Wood/TexBitmap" >
    <plugin>
      <lumoplugin name="TexBitmap" type="texture">
        <parameters>
          <parameter type="plugin" name="uvwgen" handler="default" listType="none" label="uvwgen">
            <value>/Wood/TexBitmap/uvwgen/UVWGenChannel</value>
          </parameter>
          <parameter type="plugin" name="bitmap" handler="default" listType="none" label="bitmap">
            <value>/Wood/TexBitmap/buffer/BitmapBuffer</value>
          </parameter>
          <parameter type="bool" name="tile" handler="default" listType="none" label="tile">
            <value>0</value>
          </parameter>
        </parameters>
      </lumoplugin>
    </plugin>
  </Asset>
)";
    EXPECT_EQ(expected, xmlOf(bt, u"/Wood"));
}

