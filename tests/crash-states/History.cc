#include "crash-states/History.h"

namespace crashstates {

namespace {

std::string quoted(const std::string& text) {
    return "\"" + text + "\"";
}

std::string file(Inode inode) {
    return "file " + std::to_string(inode);
}

struct Describer {
    std::string operator()(const Create& e) const {
        return "create " + quoted(e.name) + " as " + file(e.inode);
    }
    std::string operator()(const Write& e) const {
        return "write " + std::to_string(e.bytes.size()) + " bytes at " + std::to_string(e.offset) +
               " of " + file(e.inode);
    }
    std::string operator()(const Truncate& e) const {
        return "truncate " + file(e.inode) + " to " + std::to_string(e.size);
    }
    std::string operator()(const SetAttribute& e) const {
        return "set " + e.name + " of " + file(e.inode);
    }
    std::string operator()(const Link& e) const {
        return "link " + file(e.inode) + " to " + quoted(e.name);
    }
    std::string operator()(const Rename& e) const {
        return "rename " + quoted(e.from) + " to " + quoted(e.to);
    }
    std::string operator()(const Unlink& e) const { return "unlink " + quoted(e.name); }
    std::string operator()(const SyncFile& e) const {
        return (e.dataOnly ? "fdatasync " : "fsync ") + file(e.inode);
    }
    std::string operator()(const SyncDirectory&) const { return "fsync the directory"; }
};

}  // namespace

std::string describe(const Event& event) {
    return std::visit(Describer(), event);
}

}  // namespace crashstates
