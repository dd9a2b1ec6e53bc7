// The two conversion drivers: a file that loads becomes a document, any other
// file comes back as its text.
#include "materials/MaterialAssets.h"
#include "module/TextFallback.h"
#include "options/AllOptions.h"
#include "persistence/OrvMatFile.h"
#include "persistence/OrvOptFile.h"
#include "xml/AssetXmlWriter.h"

namespace OrvaneLumoCore {

std::u16string OrvMatFile::documentXml() const {
    std::u16string result;
    result.reserve(4096);
    AssetXmlWriter writer(result);
    writer.openRoot(u"orvmat");
    for (std::size_t i = 0; i < getMaterialCount(); ++i) {
        MaterialPtr material;
        getMaterial(i, material);
        writeMaterialAssets(writer, material);
    }
    writer.closeRoot();
    return result;
}

std::u16string OrvMatFile::getXml(std::u16string path) {
    OrvMatFile file;
    if (file.load(path)) return file.documentXml();
    return readFileAsText(path);
}

std::u16string OrvOptFile::documentXml(AllOptions& options) {
    std::u16string result;
    result.reserve(1 << 16);
    AssetXmlWriter writer(result);
    writer.openRoot(u"orvopt");
    options.writeXml(writer, std::u16string());
    writer.closeRoot();
    return result;
}

std::u16string OrvOptFile::getXml(std::u16string path) {
    OrvOptFile file;
    AllOptions options;
    if (file.load(options, path)) return documentXml(options);
    return readFileAsText(path);
}

}  // namespace OrvaneLumoCore
