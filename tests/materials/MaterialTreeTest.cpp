#include <gtest/gtest.h>

#include <cstdint>
#include <set>

#include "materials/MaterialTree.h"

using namespace OrvaneLumoCore;

namespace {

// The searches go down through exactly the seven one-child wrappers: not
// through the BRDF materials, multi, instance, the two-sided ones, the angle
// blend (two children) or a reference, and not through unknown tags.
TEST(MaterialTree, SingleChildWrappersAreTheSevenWrappers) {
    const std::set<std::uint32_t> wrappers = {kMaterialBump,       kMaterialLinked,
                                              kMaterialOverrideEnvironment, kMaterialDisplaced,
                                              kMaterialObjectExclusion,     kMaterialAlphaContribution,
                                              kMaterialToon};
    for (std::uint32_t type = 0; type < kMaterialTagCount + 2; ++type) {
        SCOPED_TRACE(type);
        EXPECT_EQ(isSingleChildWrapper(type), wrappers.count(type) == 1);
    }
    EXPECT_FALSE(isSingleChildWrapper(0xFFFFFFFFu));
}

}  // namespace
