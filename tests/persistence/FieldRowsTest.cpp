// The one record row form: each encoding's bytes, the version range of a row,
// defaults, constant, dropped, forced, unstored and hook rows, and the comparison.
#include <gtest/gtest.h>

#include "persistence/FieldRows.h"
#include "support/RecordBytes.h"

using namespace OrvaneLumoCore;
using namespace testsupport;

namespace {

struct Rec {
    bool flag8 = false;
    bool flag32 = false;
    std::int32_t count = 0;
    float ratio = 0;
    double time = 0;
    Color tint;
    AColor paint;
    Vector axis;
    Transform place;
    TransformD wide{};
    std::u16string title;
    std::u16string file;
    std::string note;
    std::int32_t forced = 0;
    std::int32_t level = 0;
};

typedef RowsOf<Rec> R;

// Row `ratio` comes in version 2; the dropped f32 stands in version 1 only.
const RecordRow<Rec> kRows[] = {
    R::b8(&Rec::flag8, true, 1),
    R::b32(&Rec::flag32, true, 1),
    R::i32(&Rec::count, 7, 1),
    R::f32(&Rec::ratio, 1.5, 2),
    R::f64(&Rec::time, 2.25, 1),
    R::color(&Rec::tint, Color(0.25f, 0.5f, 0.75f), 1),
    &Rec::paint,
    &Rec::axis,
    &Rec::place,
    R::transformD(&Rec::wide, 1),
    R::wideText(&Rec::title, 1),
    FieldRef<Rec>::path(&Rec::file),
    R::narrowText(&Rec::note, 1),
    R::constI32(5, 1),
    R::constF32(0.5f, 1),
    R::droppedF32(1, 1),
    R::forcedI32(&Rec::forced, 9, 1),
    R::unstored(&Rec::level, 4),
    R::hook(42, 1),
};

Rec sample() {
    Rec r;
    resetFields(r, kRows);
    r.flag8 = false;
    r.flag32 = true;
    r.count = -3;
    r.ratio = 0.125f;
    r.time = 1e10;
    r.paint = AColor(1, 2, 3, 4);
    r.axis = Vector(5, 6, 7);
    r.place = Transform(Matrix(Vector(1, 2, 3), Vector(4, 5, 6), Vector(7, 8, 9)), Vector(10, 11, 12));
    r.wide.m = r.place.m;
    r.wide.offs[0] = 0.5, r.wide.offs[1] = 1.5, r.wide.offs[2] = 2.5;
    r.title = u"Ti";
    r.file = u"C:\\A.png";
    r.note = "n";
    r.level = 11;
    return r;
}

// The bytes of sample() in `version`, the hook writing one byte 0xAB.
RecordBytes sampleBytes(int version) {
    RecordBytes b;
    b.u8(0).i32(1).i32(-3);
    if (version >= 2) b.f32(0.125f);
    b.f64(1e10).color(0.25f, 0.5f, 0.75f).floats({1, 2, 3, 4}).vec(5, 6, 7);
    b.floats({1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12}).floats({1, 2, 3, 4, 5, 6, 7, 8, 9, 0.5f, 1.5f, 2.5f});
    b.wstr("Ti").wstr("C:\\A.png").wstr("n").i32(5).f32(0.5f);
    if (version == 1) b.f32(0);
    return b.i32(9).u8(0xAB);
}

TEST(FieldRows, ResetGivesEveryFieldRowItsDefault) {
    Rec r = sample();
    resetFields(r, kRows);
    EXPECT_TRUE(r.flag8 && r.flag32);
    EXPECT_EQ(7, r.count);
    EXPECT_EQ(1.5f, r.ratio);
    EXPECT_EQ(2.25, r.time);
    EXPECT_EQ(Color(0.25f, 0.5f, 0.75f), r.tint);
    EXPECT_EQ(Matrix(Vector(0, 0, 0), Vector(0, 0, 0), Vector(0, 0, 0)), r.wide.m);
    EXPECT_TRUE(r.title.empty() && r.file.empty() && r.note.empty());
    EXPECT_EQ(9, r.forced);
    EXPECT_EQ(4, r.level);
}

TEST(FieldRows, WritesAndReadsEachVersionInTableOrder) {
    for (int version : {1, 2}) {
        SCOPED_TRACE(version);
        const Rec r = sample();
        QuickArchive out(1);
        EXPECT_TRUE(writeFields(out, r, kRows, version, [&](const RecordRow<Rec>& row) {
            EXPECT_EQ(42, row.hook);
            out.writeByte(std::uint8_t(0xAB));
            return true;
        }));
        EXPECT_EQ(sampleBytes(version).bytes(), writtenBytes(out));

        // A forced row is its default after the load whatever was stored.
        RecordBytes laid = sampleBytes(version);
        laid.data[laid.size() - 5] = 3;
        Rec back;
        QuickArchive in = laid.archive();
        int hooks = 0;
        EXPECT_TRUE(readFields(in, back, kRows, version, [&](const RecordRow<Rec>&) {
            std::uint8_t mark = 0;
            in.readByte(mark);
            EXPECT_EQ(0xAB, mark);
            return ++hooks == 1;
        }));
        EXPECT_EQ(laid.size(), in.getReadPosition());
        EXPECT_EQ(9, back.forced);
        Rec expected = r;
        if (version == 1) expected.ratio = 0;  // not in version 1: stays as it was
        EXPECT_FALSE(fieldsEqual(expected, back, kRows));  // no version holds `level`
        expected.level = back.level;
        EXPECT_TRUE(fieldsEqual(expected, back, kRows));
    }
}

TEST(FieldRows, NarrowTextKeepsItsTextWhenStoredEmpty) {
    const RecordRow<Rec> rows[] = {R::narrowText(&Rec::note, 1)};
    for (const char* stored : {"", "new"}) {
        Rec r;
        r.note = "kept";
        QuickArchive in = RecordBytes().wstr(stored).archive();
        readFields(in, r, rows, 1);
        EXPECT_EQ(*stored ? stored : "kept", r.note);
    }
}

TEST(FieldRows, HookThatFailsEndsTheRead) {
    QuickArchive in = sampleBytes(2).archive();
    Rec r;
    EXPECT_FALSE(readFields(in, r, kRows, 2, [](const RecordRow<Rec>&) { return false; }));
}

TEST(FieldRows, ComparisonFollowsTheFieldKind) {
    struct Case {
        const char* what;
        void (*change)(Rec&);
        bool equal;
    };
    const Case kCases[] = {
        {"path ignores case", [](Rec& r) { r.file = u"c:\\a.PNG"; }, true},
        {"wide text is exact", [](Rec& r) { r.title = u"ti"; }, false},
        {"bool32 by value", [](Rec& r) { r.flag32 = false; }, false},
        {"double offset", [](Rec& r) { r.wide.offs[2] = 2.5000001; }, false},
        {"acolor alpha", [](Rec& r) { r.paint.a = 0; }, false},
        {"a field no row names", [](Rec& r) {}, true},
    };
    for (const Case& c : kCases) {
        Rec changed = sample();
        c.change(changed);
        EXPECT_EQ(c.equal, fieldsEqual(sample(), changed, kRows)) << c.what;
    }
}

TEST(FieldRows, ChildRowsAreHookRows) {
    struct WithChild {
        boost::shared_ptr<BaseTexture> texture;
        float mult = 1;
    };
    const RecordRow<WithChild> rows[] = {&WithChild::texture, &WithChild::mult};
    EXPECT_EQ(RowUse::Hook, rows[0].use);
    EXPECT_EQ(0, rows[0].hook);
    EXPECT_EQ(RowUse::Field, rows[1].use);
}

}  // namespace
