#pragma once
// What the light classes share: the family base with the operations that
// follow from a class's tag and defaults, and the Asset of a light.
#include <cstddef>
#include <cstdint>
#include <string>

#include <boost/make_shared.hpp>

#include "lights/BaseLight.h"
#include "persistence/FamilyOf.h"
#include "persistence/FieldRows.h"
#include "persistence/Record.h"
#include "xml/AssetScope.h"
#include "xml/ParamRows.h"

namespace OrvaneLumoCore {

// Base of a light class `Derived` with type tag `Tag` whose record is
// written by hand. The class's defaults are its member initialisers, or its
// table's where its constructor sets them, so the family's `reset` serves,
// and `clone` copies (lights hold no shared children).
template <class Derived, std::uint32_t Tag>
using LightOf = FamilyOf<Derived, Tag, BaseLight>;

// The Asset of a light under `url`: Asset, plugin and parameters opened,
// `writeParams()` called, everything closed again.
template <class WriteParams>
void writeLightAsset(AssetXmlWriter& w, const std::u16string& url, const std::u16string& plugin,
                     WriteParams writeParams) {
    writeAsset(w, url, "light", plugin, writeParams);
}

// Base of a light whose record is one flat table that also names the XML
// parameters and gives the defaults (FlatFamilyOf gives save, load and the
// comparison, and the constructor calls setTableDefaults()): its Asset
// stands under the owner's url, "/" and the plugin name and shows the table's
// parameters, then those of writeConstantParams.
template <class Derived, std::uint32_t Tag>
class TableLightOf : public FlatFamilyOf<Derived, Tag, BaseLight> {
public:
    void writeXml(AssetXmlWriter& w, std::u16string url) override {
        const Derived& light = this->self();
        const std::u16string plugin = light.getPluginName();
        static const ShownRows<Derived> shown = shownRows<Derived>(Derived::record());
        writeLightAsset(w, url + u"/" + plugin, plugin, [&] {
            writeShownFields(w, light, shown, [](const RecordRow<Derived>&) {});
            light.writeConstantParams(w);
        });
    }
    // Parameters that no field holds: none, unless the class says otherwise.
    void writeConstantParams(AssetXmlWriter&) const {}
};

}  // namespace OrvaneLumoCore
