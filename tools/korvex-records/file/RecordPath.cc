#include "file/RecordPath.h"

#include <korvex/util/LoaderInfo.h>

#include <cerrno>

#include "Status.h"
#include "file/NewFile.h"
#include "file/OpenFile.h"

namespace {

const char* unusableDb(const Pathname& db) {
    int code = 0;
    if (db.empty()) {
        code = -2;
    } else if (!db.isAbsolute()) {
        code = -5;
    } else if (!db.exists()) {
        code = -8;
    } else if (!db.isDir()) {
        code = -11;
    }
    return LoaderInfo::getErrorMessage(code);
}

}  // namespace

Pathname recordFilePath(const Options& options) {
    if (options.file) return *options.file;
    const Pathname db = LoaderInfo::getInstance()->getKorvexDb();
    const std::string complaint = unusableDb(db);
    if (!complaint.empty()) throw Failure(USAGE, complaint);
    const Pathname directory = db / "hashDb";
    if (!isThere(directory) && !options.create) {
        throw Failure(IO_ERROR, directory +
                                    ": no such directory; put, load and batch make it with "
                                    "--create");
    }
    return directory / "data";
}

// Not before there is something to put there: what is refused leaves no trace.
void makeRecordDirectory(const Options& options) {
    if (!options.create || options.file) return;
    const Pathname directory = directoryOf(recordFilePath(options));
    if (isThere(directory)) return;
    // Another run may make it at the same time.
    if (!directory.mkdir(Pathname::MKDIR_PRIVATE) && errno != EEXIST) {
        throw Failure(IO_ERROR, withErrno("cannot make " + directory));
    }
    syncDirectory(directoryOf(directory));
}
