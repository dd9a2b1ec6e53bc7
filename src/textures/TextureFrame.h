#pragma once
// The XML frame that every texture (and every other node written the same
// way: UVW generators, bitmaps, BRDF layers) shares:
//
//   1. the node's own url: the owner's url, "/" and the plugin name;
//   2. for each child slot, in slot order, the slot url (own url, "/", the
//      slot's segment word) and, if the child is present, the child's Assets;
//   3. the node's Asset: openAsset(own url, asset type, ""), openPlugin,
//      openParameters;
//   4. the parameters; a child is referred to by a `plugin` parameter whose
//      value is the slot url, "/" and the child's plugin name, or which has no
//      value at all when the slot is empty;
//   5. closeParameters, closePlugin, closeAsset.
//
// A class describes only its slots and its parameters:
//
//   void BlendTexture::writeXml(AssetXmlWriter& w, std::u16string url) {
//       TextureFrame frame(w, *this, url);
//       const SlotRef a = frame.slot(color_a, u"color_a");   // slots first,
//       const SlotRef b = frame.slot(color_b, u"color_b");   // in slot order
//       frame.open();
//       frame.writeRef("color_a", a);                        // then parameters
//       frame.writeRef("color_b", b);
//       w.writeFloat("blend_amount", blend_amount);
//       frame.close();
//   }
//
// A slot's segment and the parameter that refers to it need not share a word
// (an InvertTexture's slot "base_texture" goes to the parameter "texture"),
// and parameters may refer to slots in another order than the slots were
// declared in; both are expressed by which SlotRef goes to which writeRef.
//
// A reference that isn't a child's Asset url (a sky's sun) is written with
// writer().writePluginRef between open() and close().
//
// A node whose own url isn't formed from its plugin name (a BRDF layer's is
// the material's url and the layer's name) passes UrlIs::Own with that url.
//
// Slots after open(), a second open() and a close() without open() are
// programming errors, caught by assertions in debug builds. Every open() needs
// its close(): the frame doesn't close on leaving its scope, since the writer
// may throw (allocation failure) and a destructor must not write then.
//
// The records of children use the member helpers of persistence/Record.h
// (loadRequiredMember / loadOptionalMember with createTexture, createUVW or
// createBitmap, and their save twins); the family base (persistence/FamilyOf.h)
// gives clone and isEqual, and a class's finishClone and sameContent use
// cloneChild and childrenEqual for each slot.
#include <string>

#include <boost/shared_ptr.hpp>

#include "persistence/Serializable.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

// A declared child slot as the parameters refer to it. The owner of the
// frame holds the child while the frame is written.
struct SlotRef {
    const OrvaneXMLSerializable* child = nullptr;  // may be null
    std::u16string url;                            // the slot's url, without the child's plugin name
};

// What the url given to TextureFrame is.
enum class UrlIs {
    Owner,  // the owner's url: the own url appends "/" and the plugin name
    Own     // the node's own url, used as it is
};

class TextureFrame {
public:
    TextureFrame(AssetXmlWriter& writer, const OrvaneXMLSerializable& self, const std::u16string& url,
                 UrlIs kind = UrlIs::Owner);
    TextureFrame(const TextureFrame&) = delete;
    TextureFrame& operator=(const TextureFrame&) = delete;

    // Declares the next child slot: forms its url and writes the child's
    // Assets now if the child is present.
    template <class T>
    SlotRef slot(const boost::shared_ptr<T>& child, const char16_t* segment) {
        SlotRef ref;
        ref.child = child.get();
        ref.url = slotUrl(segment);
        if (child) child->writeXml(writer_, ref.url);
        return ref;
    }

    // openAsset, openPlugin, openParameters.
    void open();
    // The `plugin` parameter `name` that refers to the slot's child.
    void writeRef(const WriterText& name, const SlotRef& slot);
    // closeParameters, closePlugin, closeAsset.
    void close();

    const std::u16string& ownUrl() const { return ownUrl_; }
    AssetXmlWriter& writer() { return writer_; }

private:
    std::u16string slotUrl(const char16_t* segment) const;

    enum class State { Slots, Open, Closed };

    AssetXmlWriter& writer_;
    const OrvaneXMLSerializable& self_;
    std::u16string ownUrl_;
    State state_ = State::Slots;
};

}  // namespace OrvaneLumoCore
