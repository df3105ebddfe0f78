#include <fstream>
#include <iostream>
#include <iterator>

#include "Commands.h"
#include "DumpFormat.h"
#include "Escape.h"
#include "RecordStore.h"

namespace {

std::string readAll(std::istream& in, const std::string& name) {
    std::string all{std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
    if (in.bad()) throw Failure(IO_ERROR, withErrno("cannot read " + name));
    return all;
}

std::ifstream openInput(const std::string& name) {
    std::ifstream in(name, std::ios::binary);
    in.peek();  // a directory opens, but cannot be read
    if (!in.is_open() || in.bad()) throw Failure(IO_ERROR, withErrno("cannot read " + name));
    in.clear();
    return in;
}

std::string valueToPut(const Options& options, const std::vector<std::string>& arguments) {
    if (options.input.empty() == (arguments.size() == 1)) {
        throw Failure(USAGE, "put: KEY VALUE, KEY -, or -i FILE KEY");
    }
    if (!options.input.empty()) {
        std::ifstream in = openInput(options.input);
        return readAll(in, options.input);
    }
    return arguments[1] == "-" ? readAll(std::cin, "standard input") : arguments[1];
}

}  // namespace

Status runPut(const Options& options, const std::vector<std::string>& arguments) {
    if (isRefusedKey(arguments.front())) {
        throw Failure(USAGE, "refused key: it would not survive a reload");
    }
    const std::string value = valueToPut(options, arguments);
    RecordStore store(options);
    store.beginChange();
    store.put(arguments.front(), value);
    store.save();
    return DONE;
}

Status runRemove(const Options& options, const std::vector<std::string>& arguments) {
    RecordStore store(options);
    Status status = DONE;
    bool changing = false;
    for (const std::string& key : arguments) {
        std::string ignored;
        if (!store.get(key, ignored)) {
            complain(escaped(key) + ": no such key");
            status = NOT_FOUND;
            continue;
        }
        if (!changing) store.beginChange();
        changing = true;
        store.remove(key);
    }
    if (changing) store.confirm();
    return status;
}

Status runLoad(const Options& options, const std::vector<std::string>& arguments) {
    Records records;
    if (arguments.empty()) {
        records = parseDump(std::cin);
    } else {
        std::ifstream in = openInput(arguments.front());
        records = parseDump(in);
    }
    for (const auto& record : records) {
        if (isRefusedKey(record.first)) {
            throw Failure(USAGE, "refused key \"" + escaped(record.first) +
                                     "\": it would not survive a reload");
        }
    }
    RecordStore store(options);
    store.beginChange();
    for (const auto& [key, value] : records)
        store.put(key, value);
    store.save();
    return DONE;
}
