#pragma once
// Bitmap buffers (an image file and its filtering) and the bitmap texture
// that joins one to a UVW generator. The image itself is never opened.
#include <cstdint>
#include <string>

#include "persistence/FamilyOf.h"
#include "textures/BaseBitmap.h"
#include "textures/BaseTexture.h"
#include "textures/BaseUVW.h"

namespace OrvaneLumoCore {

class BitmapBuffer : public FlatFamilyOf<BitmapBuffer, 0, BaseBitmap> {
public:
    static constexpr int kRecordVersion = 1;
    static RowSpan<RecordRow<BitmapBuffer>> record();  // `file` ignores case

    BitmapBuffer() { setTableDefaults(); }
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"BitmapBuffer"; }

    std::u16string file;
    std::int32_t filter_type;  // index into kFilterLabels
    float filter_blur;
    float gamma;
};

// Display names of the filter types, by `filter_type`; XML writes the index.
extern const char16_t* const kFilterLabels[3];

class BitmapTexture : public FamilyOf<BitmapTexture, 0, BaseTexture> {
public:
    BitmapTexture() { reset(); }

    // False, writing nothing, unless both children are set.
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    void finishClone();
    bool sameContent(const BitmapTexture& o) const;
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
