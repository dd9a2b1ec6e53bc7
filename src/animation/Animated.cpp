#include "animation/Animated.h"

#include <limits>

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"

namespace OrvaneLumoCore {

namespace {

// Every key set record holds the byte width of its times: always an f64.
constexpr std::uint64_t kTimeWidth = 8;

const double kNoKeyTime = std::numeric_limits<double>::quiet_NaN();

// earlier * (1 - w) + later * w, all in f32.
float mixReal(float a, float b, float w) { return a * (1.0f - w) + b * w; }

// float -> int32 by truncation. Values outside the range (and NaN) give the
// x86 conversion's "integer indefinite" result instead of undefined behaviour.
std::int32_t truncateToInt(float f) {
    if (!(f >= -2147483648.0f && f < 2147483648.0f)) return std::numeric_limits<std::int32_t>::min();
    return static_cast<std::int32_t>(f);
}

std::int32_t mixInt(std::int32_t a, std::int32_t b, float w) {
    return truncateToInt(mixReal(static_cast<float>(a), static_cast<float>(b), w));
}

Vector mixVector(const Vector& a, const Vector& b, float w) {
    return Vector(mixReal(a.x, b.x, w), mixReal(a.y, b.y, w), mixReal(a.z, b.z, w));
}

Transform mixTransform(const Transform& a, const Transform& b, float w) {
    return Transform(Matrix(mixVector(a.m[0], b.m[0], w), mixVector(a.m[1], b.m[1], w),
                            mixVector(a.m[2], b.m[2], w)),
                     mixVector(a.offs, b.offs, w));
}

void writeValue(QuickArchive& ar, float v) { ar.writeFloat(v); }
void writeValue(QuickArchive& ar, std::int32_t v) { ar.writeInt(v); }
void writeValue(QuickArchive& ar, const Transform& v) { ar.writeTransform(v); }
void readValue(QuickArchive& ar, float& v) { ar.readFloat(v); }
void readValue(QuickArchive& ar, std::int32_t& v) { ar.readInt(v); }
void readValue(QuickArchive& ar, Transform& v) { ar.readTransform(v); }

// Record after the version tag: count, time width, the interpolation flag
// where the class has one, then the keys in ascending time.
template <class V>
void saveKeys(QuickArchive& ar, const KeyTrack<V>& track, const bool* interpolate) {
    ar.writeLength(track.size());
    ar.writeLength(kTimeWidth);
    if (interpolate) ar.writeByte(*interpolate);
    for (const auto& key : track.keys()) {
        ar.writeDouble(key.first);
        writeValue(ar, key.second);
    }
}

// Reads the keys through `set`, so a stored key at time 0 replaces the one
// that reset left there and the others join it. False for a count the
// archive can't hold or a time width other than 8.
template <class V>
bool loadKeys(QuickArchive& ar, KeyTrack<V>& track, bool* interpolate) {
    std::uint64_t count = 0;
    if (!readCount(ar, count)) return false;
    std::uint64_t width = 0;
    ar.readLength(width);
    if (width != kTimeWidth) return false;
    if (interpolate) ar.readByte(*interpolate);
    // Keys that run past the end of the data keep the values read last.
    double time = 0;
    V value = V();
    for (std::uint64_t i = 0; i < count; ++i) {
        ar.readDouble(time);
        readValue(ar, value);
        track.set(time, value);
    }
    return true;
}

template <class V>
double keyTime(const KeyTrack<V>& track, std::int64_t index) {
    const auto* key = track.at(index);
    return key ? key->first : kNoKeyTime;
}

}  // namespace

// ---- AnimatedReal ------------------------------------------------------------

AnimatedReal::AnimatedReal(bool interpolate_) : interpolate(interpolate_) { reset(); }

bool AnimatedReal::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    saveKeys(ar, track, &interpolate);
    return true;
}

bool AnimatedReal::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, 1);
    reset();
    if (version < 0) return false;
    return loadKeys(ar, track, &interpolate);
}

float AnimatedReal::getValue(double time) const {
    return track.value(time, interpolate, 0.0f, mixReal);
}

void AnimatedReal::setValue(float value, double time) { track.set(time, value); }
std::size_t AnimatedReal::getKeyCount() const { return track.size(); }
double AnimatedReal::getKeyTime(std::int64_t index) const { return keyTime(track, index); }

void AnimatedReal::reset() {
    track.clear();
    track.set(0.0, 0.0f);
}

// ---- AnimatedInt -------------------------------------------------------------

AnimatedInt::AnimatedInt(bool interpolate_) : interpolate(interpolate_) { reset(); }

bool AnimatedInt::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    saveKeys(ar, track, &interpolate);
    return true;
}

bool AnimatedInt::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, 1);
    reset();
    if (version < 0) return false;
    return loadKeys(ar, track, &interpolate);
}

std::int32_t AnimatedInt::getValue(double time) const {
    return track.value(time, interpolate, 0, mixInt);
}

void AnimatedInt::setValue(std::int32_t value, double time) { track.set(time, value); }
std::size_t AnimatedInt::getKeyCount() const { return track.size(); }
double AnimatedInt::getKeyTime(std::int64_t index) const { return keyTime(track, index); }

void AnimatedInt::reset() {
    track.clear();
    track.set(0.0, 0);
}

// ---- AnimatedTransform -------------------------------------------------------

AnimatedTransform::AnimatedTransform() { reset(); }

bool AnimatedTransform::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    saveKeys(ar, track, nullptr);
    return true;
}

bool AnimatedTransform::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, 1);
    reset();
    if (version < 0) return false;
    // Unlike the simple values, the stored keys replace the identity key:
    // a record without keys leaves an empty set.
    track.clear();
    if (loadKeys(ar, track, nullptr)) return true;
    reset();  // a refused key head leaves the object as reset made it
    return false;
}

Transform AnimatedTransform::getValue(double time) const {
    return track.value(time, true, Transform(), mixTransform);
}

void AnimatedTransform::setValue(const Transform& value, double time) { track.set(time, value); }
std::size_t AnimatedTransform::getKeyCount() const { return track.size(); }
double AnimatedTransform::getKeyTime(std::int64_t index) const { return keyTime(track, index); }

Transform AnimatedTransform::getKeyValue(std::int64_t index) const {
    const auto* key = track.at(index);
    return key ? key->second : Transform();
}

void AnimatedTransform::reset() {
    track.clear();
    track.set(0.0, Transform());
}

}  // namespace OrvaneLumoCore
