// A field row answers only for the type of its kind: holds() says which, and
// get() of another type stops the program where the checks are built in.
// This file turns them on for itself, so the release build tests them too.
#ifndef ORVXML_FIELD_KIND_CHECKS
#define ORVXML_FIELD_KIND_CHECKS 1
#endif
#include <gtest/gtest.h>

#include "persistence/FieldRows.h"

using namespace OrvaneLumoCore;

namespace {

struct KindRec {
    bool flag = true;
    std::int32_t count = 3;
    float ratio = 0.5f;
    std::u16string title = u"T";
    std::string note = "n";
};

typedef FieldRef<KindRec> F;

TEST(FieldRefKind, HoldsOnlyTheTypeOfItsKind) {
    const F flag(&KindRec::flag), count(&KindRec::count), ratio(&KindRec::ratio);
    const F title(&KindRec::title), note(&KindRec::note);
    const F path = F::path(&KindRec::title), flag32 = F::bool32(&KindRec::flag);
    EXPECT_TRUE(flag.holds<bool>());
    EXPECT_FALSE(flag.holds<std::int32_t>());
    EXPECT_TRUE(flag32.holds<bool>());
    EXPECT_FALSE(flag32.holds<std::int32_t>());
    EXPECT_TRUE(count.holds<std::int32_t>());
    EXPECT_FALSE(count.holds<float>());
    EXPECT_TRUE(ratio.holds<float>());
    EXPECT_FALSE(ratio.holds<double>());
    EXPECT_TRUE(title.holds<std::u16string>());
    EXPECT_TRUE(path.holds<std::u16string>());
    EXPECT_FALSE(title.holds<std::string>());
    EXPECT_TRUE(note.holds<std::string>());
    EXPECT_FALSE(note.holds<std::u16string>());
    // Rows that name no member hold nothing, whatever their kind.
    EXPECT_FALSE(F().holds<std::int32_t>());
    EXPECT_FALSE(F::unbound(F::Kind::Int).holds<std::int32_t>());
    EXPECT_FALSE(F::unbound(F::Kind::Bool).holds<bool>());

    KindRec r;
    path.get<std::u16string>(r) = u"C:\\a.png";
    EXPECT_EQ(r.title, u"C:\\a.png");
    EXPECT_TRUE(flag32.get<bool>(r));
    EXPECT_EQ(count.get<std::int32_t>(r), 3);
}

#if GTEST_HAS_DEATH_TEST
TEST(FieldRefKindDeathTest, GetOfAnotherTypeStops) {
    ASSERT_TRUE(kFieldKindChecks) << "FieldRows.h was included before this file turned the checks on";
    testing::FLAGS_gtest_death_test_style = "threadsafe";
    const KindRec r;
    EXPECT_DEATH(F(&KindRec::count).get<float>(r), "doesn't hold the type asked for");
    EXPECT_DEATH(F(&KindRec::note).get<std::u16string>(r), "doesn't hold");
    EXPECT_DEATH(F::unbound(F::Kind::Int).get<std::int32_t>(r), "doesn't hold");
}
#endif

}  // namespace
