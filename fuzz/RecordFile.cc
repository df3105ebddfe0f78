#include <korvex/framework/service/ComponentException.h>
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>

#include <fcntl.h>
#include <sys/mman.h>
#include <unistd.h>

#include <memory>
#include <vector>

#include "Check.h"
#include "Input.h"
#include "reference/RecordFile.h"

namespace {

RecordFileManager& store() {
    return *RecordFileManager::instance();
}

std::map<std::string, std::string> allRecords() {
    std::vector<PersistentFullData> list;
    store().enumerate("", list);
    std::map<std::string, std::string> all;
    for (const PersistentFullData& full : list) {
        const std::unique_ptr<char[]> key(static_cast<char*>(full._pKey));
        const std::unique_ptr<char[]> value(static_cast<char*>(full._pData));
        all[std::string(key.get(), full._keySize)] = std::string(value.get(), full._dataSize);
    }
    return all;
}

// There is one store a process. Each removal saves, so to nowhere.
void empty(const std::map<std::string, std::string>& records) {
    store().setDBFile(Pathname("/dev/null"));
    for (const auto& [key, value] : records)
        store().remove(key);
}

// A file in memory, with a name.
class MemoryFile {
  public:
    MemoryFile() : _fd(memfd_create("records", 0)) {}
    MemoryFile(const MemoryFile&) = delete;
    MemoryFile& operator=(const MemoryFile&) = delete;
    ~MemoryFile() { close(_fd); }

    Pathname path() const { return Pathname("/proc/self/fd/" + std::to_string(_fd)); }
    void set(const std::string& bytes) const {
        check(ftruncate(_fd, 0) == 0, "ftruncate");
        check(pwrite(_fd, bytes.data(), bytes.size(), 0) == static_cast<ssize_t>(bytes.size()),
              "pwrite");
    }
    std::string get() const {
        std::string bytes(static_cast<std::size_t>(lseek(_fd, 0, SEEK_END)), '\0');
        check(pread(_fd, bytes.data(), bytes.size(), 0) == static_cast<ssize_t>(bytes.size()),
              "pread");
        return bytes;
    }

  private:
    const int _fd;
};

// Whether it threw for want of a version (or of memory).
bool load(const Pathname& path, const std::string& prefix = "") {
    try {
        store().preload(prefix, path);  // looks at its own version only
        return false;
    } catch (const ComponentException&) {
        return true;
    }
}

}  // namespace

// A record file as the slow way reads it; what was read is saved and read back.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    static const MemoryFile file;
    static const bool quiet = Logger::setChannelLevel(nullptr, "EMERG");
    check(quiet, "the level");
    const std::string bytes = Input(data, size).rest();
    const reference::Loaded expected = reference::loadRecords(bytes);
    file.set(bytes);
    if (expected.huge) {                          // looked at, but not kept
        load(file.path(), std::string(1, '\0'));  // which no key begins with
        return 0;
    }
    check(load(file.path()) == expected.unversioned, "what ends in an exception");
    const auto records = allRecords();
    checkSame(reference::saveRecords(records), reference::saveRecords(expected.records),
              "what was read");

    store().setDBFile(file.path());
    store().saveToFile();
    check(file.get() == reference::saveRecords(records), "what was saved");
    empty(records);
    check(!load(file.path()) && allRecords() == records, "what was read back");
    empty(records);
    return 0;
}
