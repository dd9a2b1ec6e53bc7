#include <gtest/gtest.h>

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "support/RecordBytes.h"
#include "xml/ParamRows.h"

using namespace OrvaneLumoCore;
using namespace testsupport;

namespace {

struct Inner {
    std::int32_t flag = 0;
    std::int32_t count = 0;
    float weight = 0;
    std::u16string file;
};

struct Holder {
    Inner inner;
    std::int32_t ownFlag = 0;
    std::int32_t ownCount = 0;
    bool on = false;
    double scale = 0;
    std::u16string path;
};

std::u16string written(const std::function<void(AssetXmlWriter&)>& body) {
    std::u16string out;
    AssetXmlWriter w(out);
    body(w);
    return out;
}

// A class that shows a part's table among its own parameters: the placed
// rows of both by place, then the unplaced ones, the class's own first.
TEST(ShownFields, APartsRowsStandAmongTheClassesOwnByTheirPlaces) {
    Holder h;
    h.ownCount = 4;
    h.inner.count = 9;
    h.inner.weight = 0.25f;
    h.inner.flag = 0;
    const RecordRow<Holder> own[] = {
        {&Holder::ownCount, "own_count", 2},
        {&Holder::on, "on"},
        {&Holder::scale, "scale", 4},
    };
    const RecordRow<Inner> part[] = {
        {&Inner::weight, "weight"},
        {&Inner::count, "count", 3},
        RecordRow<Inner>(&Inner::flag, "flag", 1).asFlag(),
        {&Inner::file},
    };
    const std::u16string expected = written([](AssetXmlWriter& w) {
        w.writeBool("flag", false);
        w.writeInteger("own_count", 4);
        w.writeInteger("count", 9);
        w.writeFloat("scale", 0);
        w.writeBool("on", false);
        w.writeFloat("weight", 0.25f);
    });
    EXPECT_EQ(written([&](AssetXmlWriter& w) { writeShownFieldsWithPart(w, h, own, h.inner, part); }), expected);
}

// A row that names a block of a document written as several Assets is that
// block's, not a parameter of the class's own Asset; a flag of 0 is false.
TEST(ShownFields, RowsOfADocumentsBlockAreLeftToTheDocument) {
    Holder h;
    h.ownFlag = 0;
    h.ownCount = 5;
    const RecordRow<Holder> rows[] = {
        RecordRow<Holder>(&Holder::ownCount).shownIn(3, "count", 1),
        RecordRow<Holder>(&Holder::ownFlag, "flag").asFlag(),
        RecordRow<Holder>::shownAgain(&Holder::ownCount, nullptr).shownIn(3, "count_again", 2),
    };
    EXPECT_EQ(written([&](AssetXmlWriter& w) { writeShownFields(w, h, rows); }),
              written([](AssetXmlWriter& w) { w.writeBool("flag", false); }));
    const ParamRow<Holder> param = shownParam(rows[0]);
    EXPECT_STREQ(param.name, "count");
}

// A record table shows its fields in the order of the places it gives, rows
// without a place behind them; a field shown again writes no bytes; the
// flag, label and user-data columns reach the writer; a row without a name
// is in the record only.
TEST(ShownFields, PlacesOrderTheParametersAndTheRecordKeepsItsOwn) {
    Holder h;
    h.ownFlag = 7;
    h.ownCount = 3;
    h.scale = 0.5;
    h.on = true;
    h.path = u"C:\\maps\\a.png";
    const RecordRow<Holder> rows[] = {
        {&Holder::ownCount, "count", 2},
        RecordRow<Holder>(&Holder::ownFlag, "flag", 1).asFlag(),
        {&Holder::scale},
        RecordRow<Holder>(&Holder::on, 2, "on", 0).labelled("Switch", true),
        RecordRow<Holder>::shownAgain(&Holder::ownCount, "count_again", 3),
        {FieldRef<Holder>::path(&Holder::path), "file", 4},
    };
    const std::u16string expected = written([](AssetXmlWriter& w) {
        w.writeBool("flag", true);
        w.writeInteger("count", 3);
        w.writeInteger("count_again", 3);
        w.writeFileName("file", u"C:\\maps\\a.png");
        w.writeBool("on", true, "Switch", true);
    });
    EXPECT_EQ(written([&](AssetXmlWriter& w) { writeShownFields(w, h, rows); }), expected);

    // Only the five rows with bytes are in the record, in table order.
    QuickArchive ar(1);
    writeFields(ar, h, rows, 2);
    EXPECT_EQ(RecordBytes().i32(3).i32(7).f64(0.5).b8(true).wstr("C:\\maps\\a.png").bytes(), writtenBytes(ar));
}

// Without places the parameters follow the table; a child's row goes to the hook.
TEST(ShownFields, TableOrderAndChildrenToTheHook) {
    struct WithChild {
        std::int32_t a = 1;
        boost::shared_ptr<BaseTexture> tex;
        float b = 2;
    };
    const RecordRow<WithChild> rows[] = {
        {&WithChild::b, "b"},
        RecordRow<WithChild>(&WithChild::tex, "tex").slot(u"texture"),
        {&WithChild::a, "a"},
    };
    std::vector<std::string> hooked;
    WithChild c;
    const std::u16string out = written([&](AssetXmlWriter& w) {
        writeShownFields(w, c, rows, [&](const RecordRow<WithChild>& row) {
            hooked.push_back(row.xml.name);
            EXPECT_EQ(std::u16string(row.xml.slot), u"texture");
        });
    });
    EXPECT_EQ(hooked, std::vector<std::string>{"tex"});
    EXPECT_EQ(out, written([](AssetXmlWriter& w) {
                  w.writeFloat("b", 2);
                  w.writeInteger("a", 1);
              }));
}

}  // namespace
