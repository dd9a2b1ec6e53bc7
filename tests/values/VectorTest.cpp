// Vector indexing names x, y and z, for reading and for writing.
#include <gtest/gtest.h>

#include "values/Types.h"

using OrvaneLumoCore::Vector;

TEST(Vector, IndexNamesEachComponent) {
    Vector v(1, 2, 3);
    const Vector& c = v;
    EXPECT_EQ(c[0], 1);
    EXPECT_EQ(c[1], 2);
    EXPECT_EQ(c[2], 3);
    v[0] = 4;
    v[1] = 5;
    v[2] = 6;
    EXPECT_EQ(v, Vector(4, 5, 6));
}
