// The composed matrices never depend on the C library's single-precision
// cosine and sine: each is taken in double and rounded to f32 once. The rows
// below print a different last digit with this machine's cosf/sinf.
#include <gtest/gtest.h>

#include "support/Golden.h"
#include "animation/TransformComponents.h"
#include "platform/NumberFormat.h"
#include "textures/UVWGenerators.h"

using namespace OrvaneLumoCore;

namespace {

struct TrigRow {
    Vector rotation;
    Vector scale;
    int entry;         // column * 3 + row
    const char* text;  // as the XML prints it
};

std::string printed(float value) {
    std::u16string text;
    platform::appendFloat(text, value);
    return wideToUtf8(text);
}

TEST(UVWTrig, CosineAndSineRoundedFromDouble) {
    const Vector scale(1, 1.58921f, 2);
    const TrigRow rows[] = {
        {Vector(12.9f, 117, -150), scale, 2, "0.574764"},     // cosf/sinf: 0.574763
        {Vector(-54.4f, 217, 210), scale, 4, "-0.556506"},    // -0.556505
        {Vector(146.3f, -13, 265), scale, 4, "-0.00910496"},  // -0.00910497
        {Vector(299.8f, -92, -256), scale, 1, "0.556532"},    // 0.556531
        // Rotations x 30, y 45, z 45: the same either way here.
        {Vector(30, 45, 45), scale, 2, "0.128858"},
        {Vector(30, 45, 45), scale, 5, "0.994883"},
    };
    for (const TrigRow& row : rows) {
        TransformComponents c;
        c.rotation = row.rotation;
        c.scale = row.scale;
        const Matrix m = composeMatrix(c);
        EXPECT_EQ(row.text, printed(m.m[row.entry / 3][row.entry % 3]))
            << row.rotation.x << " " << row.rotation.y << " " << row.rotation.z;
    }
}

TEST(UVWTrig, TexTransformInXml) {
    GenChannelUVW uvw;
    uvw.texComponents.rotation = Vector(12.9f, 117, -150);
    uvw.texComponents.scale = Vector(1, 1.58921f, 2);
    const std::string xml = testsupport::xmlOf(uvw, u"/M");
    const std::size_t at = xml.find("tex_transform");
    ASSERT_NE(std::string::npos, at);
    EXPECT_NE(std::string::npos, xml.find("0.574764", at)) << xml;
    EXPECT_EQ(std::string::npos, xml.find("0.574763")) << xml;
}

}  // namespace
