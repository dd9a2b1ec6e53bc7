// The options document: 22 settings blocks (options/DocumentBlocks.h), each
// an Asset of its own. A block's parameters are the rows of four record
// tables that name the block: the document's own, its params, its frame data
// and its physical camera, whose shown rows all stand in the CameraPhysical
// block. Every block and every parameter is always written.
#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string>
#include <variant>
#include <vector>

#include "options/AllOptions.h"
#include "options/DocumentBlocks.h"
#include "xml/AssetScope.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

namespace {

typedef AllOptions D;
typedef LumoUtils::LumoParams P;
typedef LumoUtils::LumoFrameData F;
typedef PhysicalCamera C;

// One parameter of a block: its place there and the row of the table that holds it.
struct BlockParam {
    int at;
    std::variant<const RecordRow<D>*, const RecordRow<P>*, const RecordRow<F>*, const RecordRow<C>*> row;
};

// The parameters of every block (index: the block), in the order of their
// places; gathered once from the four tables.
const std::vector<std::vector<BlockParam>>& blockParams() {
    static const std::vector<std::vector<BlockParam>> blocks = [] {
        std::vector<std::vector<BlockParam>> b(block::kCount + 1);
        const auto gather = [&b](const auto& rows, int everyRowIn) {
            for (const auto& row : rows) {
                const int in = everyRowIn != 0 ? everyRowIn : row.xml.group;
                // A row without a block is one of the frame data's own Asset.
                if (row.xml.name && in != 0) b[in].push_back(BlockParam{row.xml.at, &row});
            }
        };
        gather(AllOptions::record(), 0);
        gather(OrvaneParams::record(), 0);
        gather(OrvaneFrameData::record(), 0);
        gather(PhysicalCamera::record(), block::CameraPhysical);
        for (std::vector<BlockParam>& params : b)
            std::stable_sort(params.begin(), params.end(),
                             [](const BlockParam& x, const BlockParam& y) { return x.at < y.at; });
        return b;
    }();
    return blocks;
}

// The row of a document's field that a parameter shows, if it is one.
const RecordRow<D>* documentRow(const BlockParam& p) {
    const RecordRow<D>* const* row = std::get_if<const RecordRow<D>*>(&p.row);
    return row ? *row : nullptr;
}

bool isTexture(const RecordRow<D>& row) { return row.field.kind() == FieldRef<D>::Kind::Texture; }

// A texture's Asset stands under the block's url, named by its parameter
// spelled out: bg_tex is bg_texture.
std::u16string slotUrl(const std::u16string& blockUrl, const RecordRow<D>& row) {
    std::u16string url = blockUrl;
    url += u'/';
    WriterText(row.xml.name).appendTo(url);
    url += u"ture";
    return url;
}

// The four environment slots of kEnvironmentMultForm: the texture and the
// colour's multiplier. The XML shows the texture's multiplier (the row's
// field) when the texture is there.
struct EnvSlot {
    float D::*colorMult;
    TexturePtr D::*texture;
};
constexpr EnvSlot kEnvSlots[] = {
    {&D::bgColorMult, &D::bgTexture},
    {&D::giColorMult, &D::giTexture},
    {&D::reflectColorMult, &D::reflectTexture},
    {&D::refractColorMult, &D::refractTexture},
};

void writeRow(AssetXmlWriter& w, const AllOptions& o, const RecordRow<D>& row, const std::u16string& blockUrl) {
    const char* name = row.xml.name;
    const WriterText label(row.xml.label);
    const bool userData = row.xml.userData;
    switch (row.xml.form) {
    case 0:
        if (isTexture(row))
            w.writePluginRef(name, row.field.get<TexturePtr>(o).get(), slotUrl(blockUrl, row), label);
        else
            writeParam(w, shownParam(row), o);
        break;
    case kFilterTypeForm: {
        const std::int32_t k = row.field.get<std::int32_t>(o);
        w.writeInteger(name, k == 1 ? 2 : k == 2 ? 1 : k, label, userData);
        break;
    }
    case kInvertedFlagForm:
        w.writeBool(name, row.field.get<std::int32_t>(o) == 0, label, userData);
        break;
    case kChannelListForm:
        w.openList(name, "string", label);
        for (std::int32_t channel : o.renderChannels)
            if (const char16_t* channelName = AllOptions::channelName(channel)) w.writeListEntry(channelName);
        w.closeList();
        break;
    default: {
        const EnvSlot& slot = kEnvSlots[row.xml.form - kEnvironmentMultForm];
        w.writeFloat(name, o.*slot.texture ? row.field.get<float>(o) : o.*slot.colorMult, label, userData);
        break;
    }
    }
}

void writeRow(AssetXmlWriter& w, const AllOptions& o, const RecordRow<P>& row, const std::u16string&) {
    writeParam(w, shownParam(row), static_cast<const P&>(o.params));
}

void writeRow(AssetXmlWriter& w, const AllOptions& o, const RecordRow<F>& row, const std::u16string&) {
    writeParam(w, shownParam(row), static_cast<const F&>(o.frameData));
}

// The camera's animated values show their values at time 0.
void writeRow(AssetXmlWriter& w, const AllOptions& o, const RecordRow<C>& row, const std::u16string&) {
    if (row.use == RowUse::Hook)
        w.writeFloat(row.xml.name, o.physicalCamera.animated(row).getValue(0.0), WriterText(row.xml.label),
                     row.xml.userData);
    else
        writeParam(w, shownParam(row), o.physicalCamera);
}

// One block in an Assets element of its own: first the Assets of the
// textures that the block refers to, then the block's Asset.
void writeBlock(AssetXmlWriter& w, const AllOptions& o, int b, const std::u16string& url,
                const std::u16string& assetType) {
    const std::vector<BlockParam>& params = blockParams()[b];
    const std::u16string blockUrl = url + u"/" + block::nameOf(b);
    w.openAssets();
    for (const BlockParam& p : params) {
        const RecordRow<D>* row = documentRow(p);
        if (!row || !isTexture(*row)) continue;
        if (const TexturePtr& texture = row->field.get<TexturePtr>(o)) texture->writeXml(w, slotUrl(blockUrl, *row));
    }
    writeAsset(w, blockUrl, assetType, block::nameOf(b), [&] {
        for (const BlockParam& p : params) std::visit([&](const auto* row) { writeRow(w, o, *row, blockUrl); }, p.row);
    });
    w.closeAssets();
}

}  // namespace

std::size_t AllOptions::documentBlockCount() { return block::kCount; }

std::vector<AllOptions::DocumentField> AllOptions::pathAndTextureFields() const {
    std::vector<DocumentField> fields;
    for (int b = 1; b <= block::kCount; ++b) {
        for (const BlockParam& p : blockParams()[b]) {
            const RecordRow<D>* row = documentRow(p);
            if (!row) continue;  // a field of params, frame data or camera: no paths there
            if (row->field.kind() == FieldRef<D>::Kind::Path)
                fields.push_back({block::nameOf(b), row->xml.name, &row->field.get<std::u16string>(*this), nullptr});
            else if (isTexture(*row))
                fields.push_back({block::nameOf(b), row->xml.name, nullptr, &row->field.get<TexturePtr>(*this)});
        }
    }
    return fields;
}

void AllOptions::writeXml(AssetXmlWriter& writer, std::u16string url) {
    const std::u16string assetType = getAssetType();
    for (int b = 1; b <= block::kCount; ++b) writeBlock(writer, *this, b, url, assetType);
}

}  // namespace OrvaneLumoCore
