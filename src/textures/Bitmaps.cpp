#include "textures/Bitmaps.h"

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"
#include "textures/TextureFrame.h"
#include "persistence/FieldRows.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

const char16_t* const kFilterLabels[3] = {u"No filter", u"Mip-map", u"Summed-area"};

// ---- BitmapBuffer --------------------------------------------------------------

typedef BitmapBuffer B;

const RecordRow<B> kBufferRecord[] = {
    RecordRow<B>(&B::filter_type, "filter_type").byDefault(1),
    RecordRow<B>(&B::filter_blur, "filter_blur").byDefault(0.15),
    RecordRow<B>(&B::gamma, "gamma").byDefault(1),
    {FieldRef<B>::path(&B::file), "file"},
};

RowSpan<RecordRow<BitmapBuffer>> BitmapBuffer::record() { return rowSpan(kBufferRecord); }

void BitmapBuffer::writeXml(AssetXmlWriter& w, std::u16string url) {
    TextureFrame frame(w, *this, url);
    frame.open();
    static const ShownRows<B> shown = shownRows<B>(kBufferRecord);
    writeShownFields(w, *this, shown, [](const RecordRow<B>&) {});
    frame.close();
}

// ---- BitmapTexture -------------------------------------------------------------
//
// Written by hand: the record holds the generator's and the buffer's tags
// together, ahead of both records.

void BitmapTexture::reset() {
    uvw.reset();
    bitmap.reset();
    tile = true;
}

bool BitmapTexture::save(QuickArchive& ar) const {
    if (!uvw || !bitmap) return false;
    writeVersion(ar, 1);
    if (!savePairedMembers(ar, uvw, bitmap)) return false;
    ar.writeByte(tile);
    return true;
}

bool BitmapTexture::load(QuickArchive& ar) {
    if (resetAndReadVersion(*this, ar, 1) < 0) return false;
    if (!loadPairedMembers(ar, uvw, createUVW, bitmap, createBitmap)) return false;
    ar.readByte(tile);
    return true;
}

void BitmapTexture::finishClone() {
    uvw = cloneChild(uvw);
    bitmap = cloneChild(bitmap);
}

bool BitmapTexture::sameContent(const BitmapTexture& o) const {
    return childrenEqual(uvw, o.uvw) && childrenEqual(bitmap, o.bitmap) && tile == o.tile;
}

void BitmapTexture::writeXml(AssetXmlWriter& w, std::u16string url) {
    TextureFrame frame(w, *this, url);
    const SlotRef uvwSlot = frame.slot(uvw, u"uvwgen");
    const SlotRef bufferSlot = frame.slot(bitmap, u"buffer");
    frame.open();
    frame.writeRef("uvwgen", uvwSlot);
    frame.writeRef("bitmap", bufferSlot);
    w.writeBool("tile", tile);
    frame.close();
}

// ---- from a bare path ------------------------------------------------------------

TexturePtr makeBitmapTextureFromPath(const std::u16string& path) {
    if (path.empty()) return TexturePtr();
    boost::shared_ptr<BitmapTexture> texture =
        boost::dynamic_pointer_cast<BitmapTexture>(createTexture(BitmapTexture::kType));
    if (!texture) return TexturePtr();
    texture->uvw = createUVW(4);
    boost::shared_ptr<BitmapBuffer> buffer =
        boost::dynamic_pointer_cast<BitmapBuffer>(createBitmap(BitmapBuffer::kType));
    if (!buffer) return TexturePtr();
    buffer->file = path;
    texture->bitmap = buffer;
    return texture;
}

}  // namespace OrvaneLumoCore
