#include "findings/AttributeNames.h"

#include <utility>

#include "Text.h"

const std::vector<std::string>& attributeNames() {
    static const std::vector<std::string> names = {"fileName", "maxFileSize", "maxBackupIndex",
                                                   "layout", "layout.ConversionPattern"};
    return names;
}

MeantAttribute meantAttribute(const std::string& name) {
    static constexpr std::pair<const char*, const char*> kElsewhere[] = {
        {"file", "fileName"},
        {"logfile", "fileName"},
        {"maxsize", "maxFileSize"},
        {"maxlogsize", "maxFileSize"},
        {"maxbackups", "maxBackupIndex"},
        {"maxbackupfiles", "maxBackupIndex"},
        {"backupcount", "maxBackupIndex"},
        {"conversionpattern", "layout.ConversionPattern"},
        {"pattern", "layout.ConversionPattern"},
        {"layout.pattern", "layout.ConversionPattern"},
    };
    const std::string low = lowered(name);
    for (const std::string& known : attributeNames()) {
        if (low == lowered(known)) return {known, Code::KEY_CASE};
    }
    for (const auto& [other, known] : kElsewhere) {
        if (low == other) return {known, Code::KEY_OTHER_NAME};
    }
    return {name, Code::KEY_CASE};
}
