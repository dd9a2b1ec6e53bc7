// The animated reals and integers share one template, but each keeps a class
// of its own: a failed load's explanation names the record by its class.
#include <gtest/gtest.h>

#include <typeinfo>

#include "animation/Animated.h"
#include "persistence/LoadNote.h"

using namespace OrvaneLumoCore;

TEST(AnimatedName, RealAndIntKeepTheirClassNames) {
    const AnimatedReal real(true);
    const AnimatedInt integer(false);
    const OrvaneSerializable& a = real;
    const OrvaneSerializable& b = integer;
    EXPECT_EQ(className(&typeid(a)), "AnimatedReal");
    EXPECT_EQ(className(&typeid(b)), "AnimatedInt");
}
