#include "crash-states/CrashStates.h"

#include <utility>

#include "crash-states/Choices.h"

namespace crashstates {

CrashStates::CrashStates(const History& history, const Bounds& bounds)
    : _bounds(bounds), _disk(history.before, bounds.blockSize, bounds.order) {
    collect(0);
    for (std::size_t i = 0; i < history.events.size(); ++i) {
        _disk.apply(history.events[i]);
        collect(i + 1);
    }
}

const std::vector<const File*>& CrashStates::variantsOf(Inode inode) {
    const auto [at, isNew] = _variants.try_emplace(inode);
    if (isNew) {
        for (File& file : _disk.file(inode).variants(_bounds.combinations, _complete))
            at->second.push_back(&*_files.insert(std::move(file)).first);
    }
    return at->second;
}

void CrashStates::collect(std::size_t events) {
    _variants.clear();
    for (const Names& names : _disk.directory().variants(_bounds.combinations, _complete))
        collect(names, events);
}

// Each named file has any of its variants.
void CrashStates::collect(const Names& names, std::size_t events) {
    std::set<Inode> inodes;
    for (const auto& entry : names)
        inodes.insert(entry.second);
    std::vector<std::size_t> counts;
    for (const Inode inode : inodes)
        counts.push_back(variantsOf(inode).size());
    const bool all = visitChoices(counts, _bounds.combinations, [&](const Choice& choice) {
        std::map<Inode, const File*> chosen;
        auto variant = choice.begin();
        for (const Inode inode : inodes)
            chosen[inode] = variantsOf(inode)[*variant++];
        State state{{}, events};
        for (const auto& [name, inode] : names)
            state.names[name] = {inode, chosen[inode]};
        add(std::move(state));
    });
    _complete = _complete && all;
}

// Two states are one when names and files are the same, and the same names share a file.
void CrashStates::add(State&& state) {
    std::string key;
    std::map<Inode, std::size_t> numbers;
    for (const auto& [name, entry] : state.names) {
        const std::size_t number = numbers.try_emplace(entry.inode, numbers.size()).first->second;
        key += name + '\0' + std::to_string(number) + '\0';
        key.append(reinterpret_cast<const char*>(&entry.file), sizeof entry.file);
    }
    const auto [at, isNew] = _known.try_emplace(std::move(key), _states.size());
    if (isNew) {
        _states.push_back(std::move(state));
    } else {
        _states[at->second].latest = state.latest;
    }
}

}  // namespace crashstates
