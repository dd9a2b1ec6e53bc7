#pragma once
// Root of the textures.
#include <cstdint>
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"

namespace OrvaneLumoCore {

class BaseTexture : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    ~BaseTexture() override = default;
    virtual void reset() = 0;
    virtual std::uint32_t getType() const = 0;
    virtual boost::shared_ptr<BaseTexture> clone() const = 0;
    virtual bool isEqual(const boost::shared_ptr<BaseTexture>& other) const = 0;
    std::u16string getAssetType() const override { return u"texture"; }
};

typedef boost::shared_ptr<BaseTexture> TexturePtr;

// New default texture for tags 0 to 12, null otherwise (-1 included).
TexturePtr createTexture(std::int32_t tag);

// Display names of the texture classes, by type tag; no record or XML uses
// them. textureLabel gives an empty string for a tag outside the table.
const int kTextureTagCount = 13;
extern const char16_t* const kTextureLabels[kTextureTagCount];
std::u16string textureLabel(std::int32_t tag);

}  // namespace OrvaneLumoCore
