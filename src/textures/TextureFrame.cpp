#include "textures/TextureFrame.h"

#include <cassert>

#include "xml/AssetScope.h"

namespace OrvaneLumoCore {

TextureFrame::TextureFrame(AssetXmlWriter& writer, const OrvaneXMLSerializable& self,
                           const std::u16string& url, UrlIs kind)
    : writer_(writer), self_(self), ownUrl_(url) {
    if (kind == UrlIs::Owner) {
        ownUrl_ += u'/';
        ownUrl_ += self_.getPluginName();
    }
}

std::u16string TextureFrame::slotUrl(const char16_t* segment) const {
    assert(state_ == State::Slots && "slots are declared before open()");
    std::u16string url = ownUrl_;
    url += u'/';
    url += segment;
    return url;
}

void TextureFrame::open() {
    assert(state_ == State::Slots);
    state_ = State::Open;
    const std::u16string assetType = self_.getAssetType();
    openPluginAsset(writer_, ownUrl_, assetType, self_.getPluginName(), u"");
}

void TextureFrame::writeRef(const WriterText& name, const SlotRef& slot) {
    assert(state_ == State::Open);
    writer_.writePluginRef(name, slot.child, slot.url);
}

void TextureFrame::close() {
    assert(state_ == State::Open);
    state_ = State::Closed;
    closePluginAsset(writer_);
}

}  // namespace OrvaneLumoCore
