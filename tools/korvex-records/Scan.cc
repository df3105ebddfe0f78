#include "Scan.h"

#include <strings.h>

#include <cerrno>
#include <cstdio>
#include <memory>
#include <set>

#include "Escape.h"
#include "Progress.h"
#include "Stream.h"

namespace {

constexpr char kVersionKey[] = "_record-file-version";
constexpr std::size_t kVersionKeyLength = sizeof kVersionKey - 1;

bool looksLikeVersionKey(const std::string& key) {
    return strncasecmp(key.c_str(), kVersionKey, kVersionKeyLength) == 0;
}

class Scanner {
  public:
    Scanner(const Pathname& path, std::FILE* file, std::uint64_t size, const RecordVisitor& visit)
        : _path(path), _file(file), _visit(visit) {
        _result.bytes = size;
    }

    Scan run() {
        while (_result.fault.empty() && _at < _result.bytes) {
            _result.offset = _at;
            readRecord();
            progressAt(_at);
        }
        return _result;
    }

  private:
    std::uint64_t left() const { return _result.bytes - _at; }

    void fault(const std::string& reason) { _result.fault = reason; }

    void readRecord() {
        std::uint32_t keySize = 0;
        std::uint32_t valueSize = 0;
        std::string key;
        std::string value;
        if (!readLength("key", keySize) || !readField("key", keySize, &key)) return;
        if (!readLength("value", valueSize)) return;
        const bool isVersion = looksLikeVersionKey(key);
        const bool isWanted = isVersion || _visit;
        if (!readField("value", valueSize, isWanted ? &value : nullptr)) return;
        if (isVersion) {
            acceptVersion(key, value);
        } else {
            accept(key, std::move(value));
        }
    }

    void acceptVersion(const std::string& key, const std::string& value) {
        if (key != kVersionKey || _result.offset != 0) {
            fault("key \"" + escaped(key) + "\" is taken for the version");
        } else {
            _result.version = value;
        }
    }

    void accept(const std::string& key, std::string&& value) {
        if (key.find('\0') != key.npos) {
            fault("key \"" + escaped(key) + "\" holds a NUL");
        } else if (!_keys.insert(key).second) {
            fault("key \"" + escaped(key) + "\" stands twice");
        } else {
            ++_result.records;
            if (_visit) _visit(key, std::move(value));
        }
    }

    bool readLength(const char* what, std::uint32_t& length) {
        if (left() < 4) {
            fault(std::string(what) + " length cut short");
            return false;
        }
        unsigned char bytes[4];
        read(bytes, sizeof bytes);
        length = static_cast<std::uint32_t>(bytes[0]) | static_cast<std::uint32_t>(bytes[1]) << 8 |
                 static_cast<std::uint32_t>(bytes[2]) << 16 |
                 static_cast<std::uint32_t>(bytes[3]) << 24;
        return true;
    }

    // Into *field, or past it when that is null.
    bool readField(const char* what, std::uint32_t size, std::string* field) {
        if (left() < size) {
            fault(std::string(what) + " cut short: " + std::to_string(size) + " bytes, " +
                  std::to_string(left()) + " left");
            return false;
        }
        if (field != nullptr) {
            field->resize(size);
            read(field->data(), size);
        } else {
            _at += size;
            if (fseeko(_file, static_cast<off_t>(_at), SEEK_SET) != 0) failReading();
        }
        return true;
    }

    void read(void* to, std::size_t size) {
        if (size > 0 && std::fread(to, 1, size, _file) != size) failReading();
        _at += size;
    }

    [[noreturn]] void failReading() const {
        throw Failure(IO_ERROR, withErrno("cannot read " + _path));
    }

    const Pathname& _path;
    std::FILE* const _file;
    const RecordVisitor& _visit;
    std::uint64_t _at = 0;
    Scan _result;
    std::set<std::string> _keys;
};

}  // namespace

bool isRefusedKey(const std::string& key) {
    return looksLikeVersionKey(key) || key.find('\0') != key.npos;
}

Scan scan(const Pathname& file, const RecordVisitor& visit) {
    // Looked at before it is opened: a FIFO would hold us up for ever.
    struct stat st {};
    if (!file.stat(&st)) {
        if (errno != ENOENT) throw Failure(IO_ERROR, withErrno("cannot open " + file));
        Scan result;
        result.missing = true;
        return result;
    }
    if (!S_ISREG(st.st_mode)) throw Failure(IO_ERROR, file + " is no regular file");
    progressStep("scanning", static_cast<std::uint64_t>(st.st_size));
    const Stream stream(file.fopen("rb"));
    if (!stream) throw Failure(IO_ERROR, withErrno("cannot open " + file));
    return Scanner(file, stream.get(), static_cast<std::uint64_t>(st.st_size), visit).run();
}

Status unlessDamaged(const Pathname& file, const Scan& scanned, Status status) {
    if (scanned.whole()) return status;
    complain(file + ": damaged at offset " + std::to_string(scanned.offset) + ": " + scanned.fault);
    return DAMAGED;
}
