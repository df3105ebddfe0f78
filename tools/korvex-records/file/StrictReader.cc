#include "file/StrictReader.h"

#include "terminal/Progress.h"
#include "text/Escape.h"

StrictReader::StrictReader(int fd, std::uint64_t size, const std::string& name)
    : _fd(fd), _file(fd, size, name) {
    _found.bytes = size;
}

bool StrictReader::next() {
    while (_found.whole() && _at < _file.size()) {
        _found.offset = _at;
        _found.fault = readFrame(_file, _at, _frame);
        if (!_found.whole()) return false;
        _key = _file.at(_frame.keyAt(), _frame.keySize);
        const bool isRecord = accept();
        _at = _frame.end();
        progressAt(_at);
        if (isRecord) return true;
    }
    return false;
}

// False for the version and for a fault.
bool StrictReader::accept() {
    if (looksLikeVersionKey(_key)) {
        if (_key == kVersionKey && _frame.begin == 0) {
            _found.version = value();
        } else {
            _found.fault = "key \"" + escaped(_key) + "\" is taken for the version";
        }
    } else if (_key.find('\0') != _key.npos) {
        _found.fault = "key \"" + escaped(_key) + "\" holds a NUL";
    } else if (!isNew()) {
        _found.fault = "key \"" + escaped(_key) + "\" stands twice";
    } else {
        ++_found.records;
        return true;
    }
    return false;
}

bool StrictReader::isNew() {
    return _keys.add(_key, [this](const KeysSoFar::Take& take) {
        FileWindow before(_fd, _file.size(), _file.name());
        RecordFrame frame;
        for (std::uint64_t at = 0; at < _frame.begin; at = frame.end()) {
            readFrame(before, at, frame);
            take(before.at(frame.keyAt(), frame.keySize));
        }
    });
}

Status unlessDamaged(const StrictReader& reader, Status status) {
    if (reader.found().whole()) return status;
    complain(damage(reader.name(), reader.found()));
    return DAMAGED;
}

std::string damage(const std::string& name, const Scan& found) {
    return name + ": damaged at offset " + std::to_string(found.offset) + ": " + found.fault;
}
