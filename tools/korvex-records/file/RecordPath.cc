#include "file/RecordPath.h"

#include <korvex/util/LoaderInfo.h>

#include "Status.h"

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
    if (options.create && !directory.exists() && !directory.mkdir(Pathname::MKDIR_PRIVATE)) {
        throw Failure(IO_ERROR, withErrno("cannot make " + directory));
    }
    if (!directory.exists()) {
        throw Failure(IO_ERROR, directory +
                                    ": no such directory; put, load and batch make it with "
                                    "--create");
    }
    return directory / "data";
}
