#include "module/Extension.h"

#include "module/OrvMatFile.h"
#include "module/OrvOptFile.h"
#include "platform/WideChar.h"
#include "xml/XmlSink.h"

namespace OrvaneLumoCore {

bool hasExtension(const std::u16string& path, const std::u16string& first,
                  const std::u16string& second) {
    const std::size_t dot = path.rfind(u'.');
    if (dot == std::u16string::npos) return false;
    const std::u16string ext = path.substr(dot + 1);
    return platform::iequals(ext, first) || platform::iequals(ext, second);
}

std::u16string convertMaterialPath(const std::u16string& path, bool& ok) {
    std::u16string result;
    StringSink sink(result);
    ok = convertMaterialPath(path, sink);
    return result;
}

std::u16string convertOptionsPath(const std::u16string& path, bool& ok) {
    std::u16string result;
    StringSink sink(result);
    ok = convertOptionsPath(path, sink);
    return result;
}

bool convertMaterialPath(const std::u16string& path, XmlSink& sink) {
    if (!hasExtension(path, u"orvmat", u"lumat")) return false;
    writeMaterialDocument(path, sink);
    return true;
}

bool convertOptionsPath(const std::u16string& path, XmlSink& sink) {
    if (!hasExtension(path, u"orvopt", u"luopt")) return false;
    writeOptionsDocument(path, sink);
    return true;
}

}  // namespace OrvaneLumoCore
