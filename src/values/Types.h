#pragma once
// The plain value types that records and XML parameters carry. They stand
// below both the archive and the writer, which each reach them going down.
#include <cstdint>

namespace OrvaneLumoCore {

struct Vector {
    float x = 0, y = 0, z = 0;
    Vector() = default;
    constexpr Vector(float x_, float y_, float z_) : x(x_), y(y_), z(z_) {}
    // Component 0, 1 or 2 (x, y, z), named one by one: the three members are
    // no array, so stepping a pointer from one to the next is not allowed.
    float& operator[](int i) { return i == 0 ? x : i == 1 ? y : z; }
    float operator[](int i) const { return i == 0 ? x : i == 1 ? y : z; }
    bool operator==(const Vector& o) const { return x == o.x && y == o.y && z == o.z; }
    bool operator!=(const Vector& o) const { return !(*this == o); }
};

struct Color {
    float r = 0, g = 0, b = 0;
    Color() = default;
    constexpr Color(float r_, float g_, float b_) : r(r_), g(g_), b(b_) {}
    bool operator==(const Color& o) const { return r == o.r && g == o.g && b == o.b; }
    bool operator!=(const Color& o) const { return !(*this == o); }
};

// The colour that most colour fields start from.
constexpr Color kWhite(1, 1, 1);

struct AColor {
    float r = 0, g = 0, b = 0, a = 0;
    AColor() = default;
    constexpr AColor(float r_, float g_, float b_, float a_) : r(r_), g(g_), b(b_), a(a_) {}
    bool operator==(const AColor& o) const { return r == o.r && g == o.g && b == o.b && a == o.a; }
    bool operator!=(const AColor& o) const { return !(*this == o); }
};

// Three vectors; the file and the XML hold them in this order (m[0], m[1], m[2]).
struct Matrix {
    Vector m[3];
    Matrix() : m{Vector(1, 0, 0), Vector(0, 1, 0), Vector(0, 0, 1)} {}  // identity
    Matrix(const Vector& a, const Vector& b, const Vector& c) : m{a, b, c} {}
    Vector& operator[](int i) { return m[i]; }
    const Vector& operator[](int i) const { return m[i]; }
    bool operator==(const Matrix& o) const { return m[0] == o.m[0] && m[1] == o.m[1] && m[2] == o.m[2]; }
    bool operator!=(const Matrix& o) const { return !(*this == o); }
};

// A matrix and an offset; the default is the identity.
struct Transform {
    Matrix m;
    Vector offs;
    Transform() = default;
    Transform(const Matrix& m_, const Vector& o_) : m(m_), offs(o_) {}
    bool operator==(const Transform& o) const { return m == o.m && offs == o.offs; }
    bool operator!=(const Transform& o) const { return !(*this == o); }
};

// A transform held as its parts: rotation (degrees), scale, offset and mirror
// flags per axis; the default is rotation 0, scale 1, offset 0, no mirror.
struct TransformParts {
    Vector rotation;
    Vector scale{1, 1, 1};
    Vector offset;
    std::int32_t mirror[3] = {0, 0, 0};
    bool operator==(const TransformParts& o) const {
        return rotation == o.rotation && scale == o.scale && offset == o.offset &&
               mirror[0] == o.mirror[0] && mirror[1] == o.mirror[1] && mirror[2] == o.mirror[2];
    }
    bool operator!=(const TransformParts& o) const { return !(*this == o); }
};

// A rectangle as records store it (x0, y0, x1, y1), with the derived size and
// two further fields that no record holds.
struct Rect {
    std::int32_t x0 = 0, y0 = 0, x1 = 0, y1 = 0;
    std::int32_t width = 0, height = 0;
    std::int32_t reserved0 = 0, reserved1 = 0;
    bool operator==(const Rect& o) const {
        return x0 == o.x0 && y0 == o.y0 && x1 == o.x1 && y1 == o.y1;
    }
    bool operator!=(const Rect& o) const { return !(*this == o); }
};

// A transform whose offset is kept in double precision; records hold it as a
// transform of f32.
struct TransformD {
    Matrix m;
    double offs[3];
};

}  // namespace OrvaneLumoCore
