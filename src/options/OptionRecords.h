#pragma once
// The three option groups that AllOptions holds by value, each with its own
// record: the flat render parameters, the frame and view description, and the
// frame buffer's stamp.
#include <cstdint>
#include <string>

#include "options/LumoOptions.h"
#include "options/OrvaneOptionsBase.h"
#include "persistence/FieldRows.h"

namespace OrvaneLumoCore {

// An option group whose record is its version and then the fields of one
// table (in OptionRecords.cpp, with the versions it reads): save, load and
// reset walk that table. Defined for the two groups below.
template <class Fields>
class TableOptions : public OrvaneOptionsBase, public Fields {
public:
    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    void reset() override;
    // The table; rows that the options document shows name their block.
    static RowSpan<RecordRow<Fields>> record();
};

extern template class TableOptions<LumoUtils::LumoParams>;
extern template class TableOptions<LumoUtils::LumoFrameData>;

// Nearly all numbers of the render settings. Writes no XML of its own: the
// document's blocks read its fields.
class OrvaneParams : public TableOptions<LumoUtils::LumoParams> {
public:
    static constexpr int kVersion = 5;

    OrvaneParams() { reset(); }

    // The defaults of a bare parameter set. A document differs in four of
    // them; see AllOptions::reset.
    void reset() override;

    std::u16string getPluginName() const override { return u"OrvaneParams"; }
};

// The frame and view of a render. The document shows only its settings
// fields; its own XML is that of a stand-alone FrameData asset.
class OrvaneFrameData : public TableOptions<LumoUtils::LumoFrameData> {
public:
    static constexpr int kVersion = 1;

    OrvaneFrameData() { reset(); }

    // One Asset (without an Assets element) of the fields that are no settings.
    void writeXml(AssetXmlWriter& writer, std::u16string url) override;
    std::u16string getPluginName() const override { return u"FrameData"; }
};

// Text and font of the frame buffer's stamp. Writes no XML.
class OrvaneLFBStampInfo : public OrvaneOptionsBase, public LumoUtils::LumoLFBStampInfo {
public:
    static constexpr int kVersion = 2;
    static const char* const kDefaultText;

    OrvaneLFBStampInfo() { reset(); }

    bool save(QuickArchive& ar) const override;
    bool load(QuickArchive& ar) override;
    // Clears the three integers and the font description and sets the default
    // text; font size and name keep what the constructor gave them.
    void reset() override;

    std::u16string getPluginName() const override { return u"LFBStampInfo"; }
};

}  // namespace OrvaneLumoCore
