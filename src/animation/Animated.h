#pragma once
// Values keyed by time: a real, an integer and a transform. Each holds a set of
// keys sorted by ascending time; two times nearer than 1e-12 are the same key.
// Callers take a value out (usually the one at time 0) and write that; these
// classes write no XML of their own.
#include <cmath>
#include <cstddef>
#include <cstdint>
#include <iterator>
#include <map>
#include <string>

#include "persistence/Serializable.h"
#include "values/Types.h"

namespace OrvaneLumoCore {

// Orders key times; times less than 1e-12 apart compare as the same key.
struct KeyTimeLess {
    static constexpr double kSameKey = 1e-12;
    bool operator()(double a, double b) const { return std::fabs(a - b) >= kSameKey && b > a; }
};

// The key set shared by the three animated classes: storage, index access and
// the value at a time.
template <class V>
class KeyTrack {
public:
    typedef std::map<double, V, KeyTimeLess> Map;

    // Replaces the value of the key that is the same key as `time` (the key
    // keeps its own time), else inserts a new key.
    void set(double time, const V& value) { keys_[time] = value; }
    void clear() { keys_.clear(); }
    std::size_t size() const { return keys_.size(); }
    const Map& keys() const { return keys_; }

    // The key at place `index` in ascending order, or null outside the keys.
    const typename Map::value_type* at(std::int64_t index) const;

    // Value at `time`. `lerp(a, b, w)` mixes two key values by the f32 weight
    // w; it is called only when `interpolate` is set. `none` is the result
    // of an empty set.
    template <class Lerp>
    V value(double time, bool interpolate, const V& none, Lerp lerp) const;

    bool operator==(const KeyTrack& o) const { return keys_ == o.keys_; }

private:
    Map keys_;
};

template <class V>
const typename KeyTrack<V>::Map::value_type* KeyTrack<V>::at(std::int64_t index) const {
    if (index < 0 || static_cast<std::uint64_t>(index) >= keys_.size()) return nullptr;
    typename Map::const_iterator it = keys_.begin();
    std::advance(it, static_cast<std::ptrdiff_t>(index));
    return &*it;
}

template <class V>
template <class Lerp>
V KeyTrack<V>::value(double time, bool interpolate, const V& none, Lerp lerp) const {
    if (keys_.empty()) return none;
    typename Map::const_iterator same = keys_.find(time);
    if (same != keys_.end()) return same->second;

    // The first key later than `time`, walking from the first key.
    const KeyTimeLess less;
    typename Map::const_iterator later = keys_.begin();
    while (later != keys_.end() && !less(time, later->first)) ++later;
    if (later == keys_.end()) return keys_.rbegin()->second;

    // Before the first key there is no earlier key to mix with: the span would
    // be zero. The first key's value is the answer, interpolating or not.
    if (later == keys_.begin()) return later->second;

    typename Map::const_iterator earlier = later;
    --earlier;
    if (!interpolate) return earlier->second;
    const float w = static_cast<float>((time - earlier->first) / (later->first - earlier->first));
    return lerp(earlier->second, later->second, w);
}

// A value of type V (f32 or int32) keyed by time, and whether values between
// two keys are mixed or held. An int32 is mixed as f32 and truncated back.
template <class V>
class AnimatedValue : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    explicit AnimatedValue(bool interpolate);
    ~AnimatedValue() override = default;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    virtual V getValue(double time) const;
    virtual void setValue(V value, double time);
    virtual std::size_t getKeyCount() const;
    // Time of the key at `index` in ascending order; quiet NaN outside the keys.
    virtual double getKeyTime(std::int64_t index) const;
    // One key (0, 0). The interpolation flag stays.
    virtual void reset();

    void writeXml(AssetXmlWriter&, std::u16string) override {}
    std::u16string getPluginName() const override { return std::u16string(); }
    std::u16string getAssetType() const override { return std::u16string(); }

    bool operator==(const AnimatedValue& o) const {
        return interpolate == o.interpolate && track == o.track;
    }
    bool operator!=(const AnimatedValue& o) const { return !(*this == o); }

    KeyTrack<V> track;
    bool interpolate;
};

// Both are built once, in Animated.cpp.
extern template class AnimatedValue<float>;
extern template class AnimatedValue<std::int32_t>;

// Classes of their own rather than aliases: a load's explanation names the
// record's class.
class AnimatedReal : public AnimatedValue<float> {
public:
    using AnimatedValue::AnimatedValue;
};

class AnimatedInt : public AnimatedValue<std::int32_t> {
public:
    using AnimatedValue::AnimatedValue;
};

// Always interpolates, each of the twelve numbers on its own.
class AnimatedTransform : public OrvaneSerializable {
public:
    AnimatedTransform();
    ~AnimatedTransform() override = default;

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    // The identity when there are no keys.
    virtual Transform getValue(double time) const;
    virtual void setValue(const Transform& value, double time);
    virtual std::size_t getKeyCount() const;
    virtual double getKeyTime(std::int64_t index) const;
    // The identity for an index that names no key.
    virtual Transform getKeyValue(std::int64_t index) const;
    // One key: the identity at time 0.
    virtual void reset();
    virtual std::u16string getPluginName() const { return std::u16string(); }
    virtual std::u16string getAssetType() const { return std::u16string(); }
    virtual void writeXml(AssetXmlWriter&, std::u16string) {}

    bool operator==(const AnimatedTransform& o) const { return track == o.track; }
    bool operator!=(const AnimatedTransform& o) const { return !(*this == o); }

    KeyTrack<Transform> track;
};

}  // namespace OrvaneLumoCore
