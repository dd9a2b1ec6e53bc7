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

// The mix of each animated value type.
float mixValue(float a, float b, float w) { return mixReal(a, b, w); }
std::int32_t mixValue(std::int32_t a, std::int32_t b, float w) {
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

// ---- AnimatedReal and AnimatedInt -------------------------------------------

template <class V>
AnimatedValue<V>::AnimatedValue(bool interpolate_) : interpolate(interpolate_) { reset(); }

template <class V>
bool AnimatedValue<V>::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    saveKeys(ar, track, &interpolate);
    return true;
}

template <class V>
bool AnimatedValue<V>::load(QuickArchive& ar) {
    const int version = readVersion(ar, 1, 1);
    reset();
    if (version < 0) return false;
    return loadKeys(ar, track, &interpolate);
}

template <class V>
V AnimatedValue<V>::getValue(double time) const {
    return track.value(time, interpolate, V(0), [](V a, V b, float w) { return mixValue(a, b, w); });
}

template <class V>
void AnimatedValue<V>::setValue(V value, double time) { track.set(time, value); }
template <class V>
std::size_t AnimatedValue<V>::getKeyCount() const { return track.size(); }
template <class V>
double AnimatedValue<V>::getKeyTime(std::int64_t index) const { return keyTime(track, index); }

template <class V>
void AnimatedValue<V>::reset() {
    track.clear();
    track.set(0.0, V(0));
}

template class AnimatedValue<float>;
template class AnimatedValue<std::int32_t>;

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
