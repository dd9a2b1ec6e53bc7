#include "module/Extension.h"

#include "persistence/OrvMatFile.h"
#include "persistence/OrvOptFile.h"
#include "platform/WideChar.h"

namespace OrvaneLumoCore {

bool hasExtension(const std::u16string& path, const std::u16string& first,
                  const std::u16string& second) {
    const std::size_t dot = path.rfind(u'.');
    if (dot == std::u16string::npos) return false;
    const std::u16string ext = path.substr(dot + 1);
    return platform::iequals(ext, first) || platform::iequals(ext, second);
}

std::u16string convertMaterialPath(const std::u16string& path, bool& ok) {
    ok = hasExtension(path, u"orvmat", u"lumat");
    if (!ok) return std::u16string();
    OrvMatFile file;
    return file.getXml(path);
}

std::u16string convertOptionsPath(const std::u16string& path, bool& ok) {
    ok = hasExtension(path, u"orvopt", u"luopt");
    if (!ok) return std::u16string();
    OrvOptFile file;
    return file.getXml(path);
}

}  // namespace OrvaneLumoCore
