#include "Text.h"
#include "findings/Attributes.h"
#include "findings/Findings.h"
#include "findings/MeantAppender.h"

namespace {

constexpr std::int64_t kFewBytes = 256;       // a line or so
constexpr std::uint32_t kManyBackups = 1000;  // each is renamed at every rotation
constexpr std::int64_t kMebibyte = 1 << 20;

bool isMeantToBeSet(const Reading& reading, const Appender& appender, const char* attribute) {
    return isMeantToBeSet(reading.config, reading.source, appender, attribute);
}

// What every start of a program says of limits that cannot work.
void checkComplaints(const Reading& reading, const Appender& appender, Findings& to) {
    for (const std::string_view complaint : appender.complaints) {
        const bool backups = beginsWith(complaint, "has maxBackupIndex");
        if (!backups && !beginsWith(complaint, "has maxSize")) continue;
        const bool size = endsWith(complaint, "maxSize, ignoring");
        if (isMeantToBeSet(reading, appender, size ? "maxFileSize" : "fileName")) continue;
        const ConfigStatement& said = *lastOf(appender, backups ? "maxBackupIndex" : "maxFileSize");
        tell(to, size ? Code::LIMIT_NO_SIZE : Code::LIMIT_NO_FILE,
             attributeOf(reading.source, said).place(),
             "Appender " + quoted(appender.name) + ' ' + std::string(complaint));
    }
}

void checkSize(const Reading& reading, const Appender& appender, Findings& to) {
    const ConfigStatement* const said = lastOf(appender, "maxFileSize");
    if (said == nullptr) return;
    const Place place = valueOf(reading.source, *said).place();
    const std::int64_t size = appender.made->maxFileSize();
    if (size < 0) {
        return tell(to, Code::LIMIT_HUGE, place,
                    "maxFileSize " + said->value + " is too large: it is no limit");
    }
    if (size == 0) return;
    if (size < kFewBytes) {
        tell(to, Code::LIMIT_SMALL, place,
             "maxFileSize is in bytes: the file is rotated after nearly every line",
             std::to_string(size * kMebibyte));
    }
    const bool backups = isSpokenOf(appender, "maxBackupIndex") ||
                         isMeantToBeSet(reading, appender, "maxBackupIndex");
    if (!backups) {
        tell(to, Code::LIMIT_NO_BACKUP, place,
             "there is no maxBackupIndex: beyond " + std::to_string(size) +
                 " bytes the file begins again empty, and what it held is lost");
    }
}

void checkBackups(const Reading& reading, const Appender& appender, Findings& to) {
    const std::uint32_t backups = appender.made->maxBackupIndex();
    if (backups <= kManyBackups) return;
    tell(to, Code::LIMIT_BACKUPS,
         valueOf(reading.source, *lastOf(appender, "maxBackupIndex")).place(),
         std::to_string(backups) +
             " backups are more than anybody has: the number is how many files are kept, and each "
             "is renamed at every rotation");
}

}  // namespace

void findInLimits(const Reading& reading, Findings& to) {
    for (const Appender& appender : reading.config.appenders) {
        if (!meantAppender(reading.config, appender).empty()) continue;
        checkComplaints(reading, appender, to);
        checkSize(reading, appender, to);
        checkBackups(reading, appender, to);
    }
}
