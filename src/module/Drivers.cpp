// The two conversion drivers: a file that loads becomes a document, any other
// file comes back as its text.
#include "materials/MaterialAssets.h"
#include "module/TextFallback.h"
#include "options/AllOptions.h"
#include "persistence/OrvMatFile.h"
#include "persistence/OrvOptFile.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

std::u16string OrvMatFile::getXml(std::u16string path) {
    std::u16string result;
    OrvMatFile file;
    if (file.load(path)) {
        result.reserve(4096);
        AssetXmlWriter writer(result);
        writer.openRoot(u"orvmat");
        for (std::size_t i = 0; i < file.getMaterialCount(); ++i) {
            MaterialPtr material;
            file.getMaterial(i, material);
            writeMaterialAssets(writer, material);
        }
        writer.closeRoot();
    } else {
        result = readFileAsText(path);
    }
    return result;
}

std::u16string OrvOptFile::getXml(std::u16string path) {
    std::u16string result;
    OrvOptFile file;
    AllOptions options;
    if (file.load(options, path)) {
        result.reserve(1 << 16);
        AssetXmlWriter writer(result);
        writer.openRoot(u"orvopt");
        options.writeXml(writer, std::u16string());
        writer.closeRoot();
    } else {
        result = readFileAsText(path);
    }
    return result;
}

}  // namespace OrvaneLumoCore
