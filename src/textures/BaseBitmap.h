#pragma once
// Root of the bitmaps.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class BaseBitmap : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    ~BaseBitmap() override = default;
    virtual void reset() = 0;
    virtual std::uint32_t getType() const = 0;
    virtual boost::shared_ptr<BaseBitmap> clone() const = 0;
    virtual bool isEqual(const boost::shared_ptr<BaseBitmap>& other) const = 0;
    std::u16string getAssetType() const override { return u"bitmap"; }
};

typedef boost::shared_ptr<BaseBitmap> BitmapPtr;

// New BitmapBuffer for tag 0, null otherwise.
BitmapPtr createBitmap(std::int32_t tag);

}  // namespace OrvaneLumoCore
