#pragma once
// The two interfaces of every model class: the binary record and the XML Asset.
#include <string>

// The writer (xml/AssetXmlWriter.h) is only named here, by reference: the
// archive's folder stands below xml/ and doesn't include it; a class that
// writes its Asset includes the writer itself.
class AssetXmlWriter;

class OrvaneXMLSerializable {
public:
    virtual ~OrvaneXMLSerializable() = default;
    // Writes the object's Asset (and its children's) under `url`.
    virtual void writeXml(AssetXmlWriter& writer, std::u16string url) = 0;
    virtual std::u16string getPluginName() const = 0;
    virtual std::u16string getAssetType() const = 0;
    // What a `plugin` parameter that refers to the object writes behind the
    // slot url and "/": the plugin name unless the class says otherwise, kept
    // in `scratch` if made for the call. Null for an object whose Asset
    // stands under the slot url itself. The writer learns it here, so it
    // names no model class.
    virtual const std::u16string* referenceName(std::u16string& scratch) const {
        scratch = getPluginName();
        return &scratch;
    }
};

namespace OrvaneLumoCore {

class QuickArchive;

class OrvaneSerializable {
public:
    virtual ~OrvaneSerializable() = default;
    // Writes the record at the archive's write position.
    virtual bool save(QuickArchive& ar) const = 0;
    // Reads the record from the archive's read position. On false the object
    // stays as far as it got; the caller gives up on the whole graph.
    virtual bool load(QuickArchive& ar) = 0;
};

// A record with an Asset of its own that can be set back to its defaults:
// what the root of a family is.
class OrvaneRecord : public OrvaneSerializable, public OrvaneXMLSerializable {
public:
    virtual void reset() = 0;
};

}  // namespace OrvaneLumoCore
