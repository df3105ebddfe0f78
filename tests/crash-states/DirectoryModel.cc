#include "crash-states/DirectoryModel.h"

#include <algorithm>
#include <utility>

namespace crashstates {

namespace {

void enterAll(const std::map<std::string, std::optional<Inode>>& changed, Names& names) {
    for (const auto& [name, inode] : changed) {
        if (inode) {
            names[name] = *inode;
        } else {
            names.erase(name);
        }
    }
}

}  // namespace

DirectoryModel::DirectoryModel(Names durable, NameOrder order)
    : _order(order), _durable(std::move(durable)), _visible(_durable) {}

bool DirectoryModel::Change::touchesWhat(const Change& other) const {
    const auto sameName = [&](const auto& entry) { return other.names.count(entry.first) > 0; };
    const auto sameFile = [&](Inode inode) { return other.inodes.count(inode) > 0; };
    return std::any_of(names.begin(), names.end(), sameName) ||
           std::any_of(inodes.begin(), inodes.end(), sameFile);
}

void DirectoryModel::add(Change change) {
    for (const auto& entry : change.names) {
        const auto had = _visible.find(entry.first);
        if (had != _visible.end()) change.inodes.insert(had->second);
        if (entry.second) change.inodes.insert(*entry.second);
    }
    enterAll(change.names, _visible);
    _pending.push_back(std::move(change));
}

void DirectoryModel::enter(const std::string& name, Inode inode) {
    add({{{name, inode}}, {}});
}

// Two names of one file stay as they are, as rename(2) has it.
void DirectoryModel::rename(const std::string& from, const std::string& to) {
    const Inode inode = _visible.at(from);
    const auto there = _visible.find(to);
    if (there != _visible.end() && there->second == inode) return;
    add({{{from, std::nullopt}, {to, inode}}, {}});
}

void DirectoryModel::unlink(const std::string& name) {
    add({{{name, std::nullopt}}, {}});
}

void DirectoryModel::sync() {
    _durable = _visible;
    _pending.clear();
}

bool DirectoryModel::mayFollow(const Arrived& arrived, std::size_t change) const {
    for (std::size_t i = 0; i < change; ++i) {
        const bool isFirst =
            _order == NameOrder::OF_ALL || _pending[change].touchesWhat(_pending[i]);
        if (isFirst && !arrived[i]) return false;
    }
    return true;
}

// Decides the changes behind arrived.size(); false when more than `limit` were found.
bool DirectoryModel::findAll(Arrived& arrived, std::size_t limit,
                             std::vector<Arrived>& found) const {
    const std::size_t next = arrived.size();
    if (next == _pending.size()) {
        found.push_back(arrived);
        return found.size() <= limit;
    }
    arrived.push_back(false);
    bool all = findAll(arrived, limit, found);
    arrived.back() = true;
    if (all && mayFollow(arrived, next)) all = findAll(arrived, limit, found);
    arrived.pop_back();
    return all;
}

std::vector<DirectoryModel::Arrived> DirectoryModel::someArrived() const {
    std::vector<Arrived> found;
    for (std::size_t i = 0; i <= _pending.size(); ++i) {
        Arrived arrived(_pending.size(), false);
        std::fill_n(arrived.begin(), i, true);
        found.push_back(arrived);
        for (std::size_t j = i + 1; j < _pending.size(); ++j)
            arrived[j] = mayFollow(arrived, j);
        found.push_back(arrived);
    }
    return found;
}

Names DirectoryModel::with(const Arrived& arrived) const {
    Names names = _durable;
    for (std::size_t i = 0; i < arrived.size(); ++i) {
        if (arrived[i]) enterAll(_pending[i].names, names);
    }
    return names;
}

std::vector<Names> DirectoryModel::variants(std::size_t limit, bool& complete) const {
    std::vector<Arrived> found;
    Arrived none;
    if (!findAll(none, limit, found)) {
        complete = false;
        found = someArrived();
    }
    std::set<Names> distinct;
    for (const Arrived& arrived : found)
        distinct.insert(with(arrived));
    return {distinct.begin(), distinct.end()};
}

}  // namespace crashstates
