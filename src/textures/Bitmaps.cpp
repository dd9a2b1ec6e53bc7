#include "textures/Bitmaps.h"

#include "persistence/QuickArchive.h"
#include "persistence/Record.h"
#include "platform/WideChar.h"
#include "textures/TextureFrame.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

const char16_t* const kFilterLabels[3] = {u"No filter", u"Mip-map", u"Summed-area"};

// ---- BitmapBuffer --------------------------------------------------------------

void BitmapBuffer::reset() {
    file.clear();
    filter_type = 1;
    filter_blur = 0.15f;
    gamma = 1.0f;
}

bool BitmapBuffer::save(QuickArchive& ar) const {
    writeVersion(ar, 1);
    ar.writeInt(filter_type);
    ar.writeFloat(filter_blur);
    ar.writeFloat(gamma);
    ar.writeWString(file);
    return true;
}

bool BitmapBuffer::load(QuickArchive& ar) {
    reset();
    if (readVersion(ar, 1, 1) < 0) return false;
    ar.readInt(filter_type);
    ar.readFloat(filter_blur);
    ar.readFloat(gamma);
    ar.readWString(file);
    return true;
}

bool BitmapBuffer::sameContent(const BitmapBuffer& o) const {
    return platform::iequals(file, o.file) && filter_type == o.filter_type &&
           filter_blur == o.filter_blur && gamma == o.gamma;
}

void BitmapBuffer::writeXml(AssetXmlWriter& w, std::u16string url) {
    TextureFrame frame(w, *this, url);
    frame.open();
    w.writeInteger("filter_type", filter_type);
    w.writeFloat("filter_blur", filter_blur);
    w.writeFloat("gamma", gamma);
    w.writeFileName("file", file);
    frame.close();
}

// ---- BitmapTexture -------------------------------------------------------------

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
    reset();
    if (readVersion(ar, 1, 1) < 0) return false;
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
