#pragma once
// Bitmap buffers (an image file and its filtering) and the bitmap texture
// that joins one to a UVW generator. The image itself is never opened.
#include <cstdint>
#include <string>

#include "textures/BaseBitmap.h"
#include "textures/BaseTexture.h"
#include "textures/BaseUVW.h"

namespace OrvaneLumoCore {

class BitmapBuffer : public BaseBitmap {
public:
    static const std::uint32_t kType = 0;
    BitmapBuffer() { reset(); }

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    BitmapPtr clone() const override;
    bool isEqual(const BitmapPtr& other) const override;  // `file` ignores case
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"BitmapBuffer"; }

    std::u16string file;
    std::int32_t filter_type;  // index into kFilterLabels
    float filter_blur;
    float gamma;
};

// Display names of the filter types, by `filter_type`; XML writes the index.
extern const char16_t* const kFilterLabels[3];

class BitmapTexture : public BaseTexture {
public:
    static const std::uint32_t kType = 0;
    BitmapTexture() { reset(); }

    // False, writing nothing, unless both children are set.
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    std::uint32_t getType() const override { return kType; }
    TexturePtr clone() const override;
    bool isEqual(const TexturePtr& other) const override;
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"TexBitmap"; }

    UVWPtr uvw;
    BitmapPtr bitmap;
    bool tile;
};

// A ready bitmap texture on `path`, for old records that stored bare paths: a
// channel generator and a buffer with that file, all else at its defaults.
// Null for an empty path.
TexturePtr makeBitmapTextureFromPath(const std::u16string& path);

}  // namespace OrvaneLumoCore
