#include "RecordStore.h"

#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>

#include <sys/file.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <limits>
#include <memory>

#include "Compare.h"
#include "Progress.h"
#include "SafeCopy.h"
#include "Status.h"

namespace {

RecordFileManager& manager() {
    return *RecordFileManager::instance();
}

// Through symbolic links, because the copy is moved onto the file itself.
Pathname resolved(const Pathname& path) {
    const std::unique_ptr<char, decltype(&std::free)> real(realpath(path.c_str(), nullptr),
                                                           &std::free);
    return real ? Pathname(real.get()) : path;
}

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
    if (!options.file.empty()) return resolved(options.file);
    const Pathname db = LoaderInfo::getInstance()->getKorvexDb();
    const std::string complaint = unusableDb(db);
    if (!complaint.empty()) throw Failure(USAGE, complaint);
    const Pathname directory = db / "hashDb";
    if (options.create && !directory.exists() && !directory.mkdir(Pathname::MKDIR_PRIVATE)) {
        throw Failure(IO_ERROR, withErrno("cannot make " + directory));
    }
    return resolved(directory / "data");
}

RecordStore::RecordStore(const Options& options)
    : _file(recordFilePath(options)),
      _new(_file + ".new"),
      _copy(_file + ".copy"),
      _force(options.force) {
    lock();
    _scan = scan(_file);
    if (!_scan.whole() && restoreCopy()) {
        complain(_file + ": damaged at offset " + std::to_string(_scan.offset) + ": " +
                 _scan.fault + "; restored from the copy of a former run that was cut off");
        _scan = scan(_file);
    }
    load();
}

RecordStore::~RecordStore() {
    if (!_changing) return;
    _new.unlink();
    _copy.unlink();
}

// Without a lock file, which a directory that may only be read does not allow, nobody can be
// writing either.
void RecordStore::lock() {
    progressStep("waiting for another run");
    const Pathname name(_file + ".lock");
    _lock = FileDescriptor(::open(name.c_str(), O_RDONLY | O_CREAT | O_NOFOLLOW | O_CLOEXEC, 0600));
    if (!_lock.valid()) return;
    while (flock(_lock.osdep(), LOCK_EX) != 0) {
        if (errno != EINTR) throw Failure(IO_ERROR, withErrno("cannot lock " + name));
    }
}

void RecordStore::load() {
    progressStep("reading");
    manager().setDBFile(_file);
    try {
        manager().readFile();
    } catch (const ComponentException&) {  // logged; the scan has found the damage as well
    }
    // The store passes over what it cannot read; a change on top of that would lose it for good.
    if (_scan.whole() && enumerate("").size() != _scan.records) {
        throw Failure(IO_ERROR, "cannot read all of " + _file);
    }
}

bool RecordStore::get(const std::string& key, std::string& value) const {
    PersistentHashData data;
    manager().get(key, data);
    if (data._pData == nullptr) return false;
    const std::unique_ptr<char[]> owner(static_cast<char*>(data._pData));
    value.assign(owner.get(), data._size);
    return true;
}

std::vector<RecordStore::Record> RecordStore::enumerate(const std::string& prefix) const {
    std::vector<PersistentFullData> list;
    manager().enumerate(prefix, list);
    std::vector<Record> records;
    records.reserve(list.size());
    for (const PersistentFullData& full : list) {
        const std::unique_ptr<char[]> key(static_cast<char*>(full._pKey));
        const std::unique_ptr<char[]> value(static_cast<char*>(full._pData));
        records.push_back({{key.get(), full._keySize}, {value.get(), full._dataSize}});
    }
    return records;
}

void RecordStore::beginChange() {
    if (!_scan.whole() && !_force) {
        throw Failure(DAMAGED, _file + ": damaged at offset " + std::to_string(_scan.offset) +
                                   ": " + _scan.fault + "; not written to without --force");
    }
    if (!_lock.valid()) throw Failure(IO_ERROR, withErrno("cannot lock " + _file + ".lock"));
    _changing = true;
    if (!_scan.missing) makeSafeCopy(_file, _copy);
    _new.unlink();  // what a killed run left must not pass for what is saved now, nor a link
    manager().setDBFile(_new);
}

void RecordStore::put(const std::string& key, const std::string& value) {
    if (isRefusedKey(key)) throw Failure(USAGE, "refused key: it would not survive a reload");
    if (value.size() > std::numeric_limits<std::uint32_t>::max()) {
        throw Failure(USAGE, "value too large: a record holds less than 4 GiB");
    }
    PersistentHashData data;
    data._pData = const_cast<char*>(value.data());
    data._size = static_cast<std::uint32_t>(value.size());
    manager().put(key, data, false);
}

bool RecordStore::remove(const std::string& key) {
    return manager().remove(key);
}

void RecordStore::save() {
    progressStep("saving");
    manager().saveToFile();
    confirm();
}

void RecordStore::confirm() {
    if (!replaceFile()) {
        throw Failure(IO_ERROR, "cannot save " + _file + " (the log says why); it is as it was");
    }
    if (!_scan.missing) dropSafeCopy(_copy);
}

bool RecordStore::replaceFile() {
    if (!holdsWhatMemoryHolds(_new)) return false;
    if (!_scan.missing && !takeAttributes(_file, _new)) return false;
    if (!syncFile(_new) || !_new.renameTo(_file)) return false;
    _changing = false;
    syncDirectoryOf(_file);
    if (holdsWhatMemoryHolds(_file)) return true;
    restoreCopy();
    return false;
}

// Without the lock some run may still be at work.
bool RecordStore::restoreCopy() const {
    if (!_lock.valid() || !_copy.exists() || !scan(_copy).whole()) return false;
    if (!_copy.renameTo(_file)) {
        throw Failure(IO_ERROR, withErrno("cannot restore " + _file + " from " + _copy));
    }
    syncDirectoryOf(_file);
    return true;
}

bool RecordStore::holdsWhatMemoryHolds(const Pathname& saved) const {
    return fileHolds(saved, enumerate(""));
}
