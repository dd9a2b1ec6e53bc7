// An archive owns its blocks alone: it moves, and a copy doesn't compile, so
// no two archives ever write to the same block.
#include <gtest/gtest.h>

#include <type_traits>
#include <utility>

#include "persistence/QuickArchive.h"

using namespace OrvaneLumoCore;

static_assert(!std::is_copy_constructible<QuickArchive>::value, "a copy would share the blocks");
static_assert(!std::is_copy_assignable<QuickArchive>::value, "a copy would share the blocks");
static_assert(std::is_move_constructible<QuickArchive>::value, "archives are returned by value");
static_assert(std::is_move_assignable<QuickArchive>::value, "archives are returned by value");

TEST(QuickArchiveMove, TheMovedArchiveKeepsItsBytesAndCursors) {
    QuickArchive first(static_cast<std::size_t>(1));
    first.writeInt(7);
    first.writeInt(8);
    std::int32_t v = 0;
    first.readInt(v);

    QuickArchive moved(std::move(first));
    EXPECT_EQ(moved.getWritePosition(), 8u);
    moved.readInt(v);
    EXPECT_EQ(v, 8);

    QuickArchive assigned(static_cast<std::size_t>(3));
    assigned = std::move(moved);
    EXPECT_EQ(assigned.getBlockCount(), 1u);
    assigned.setReadPosition(0);
    assigned.readInt(v);
    EXPECT_EQ(v, 7);
}
