#pragma once

// The rows of the store's table, over a contestant: a class with
//
//     void open(const std::string& path);        // a store at that path; made if absent
//     void load();                               // all its records into memory
//     void hold(const Map&);                     // has these records in memory, as load() leaves
//     it void save();                               // everything it holds, into an empty store
//     std::size_t get(const std::string& key);   // copies the value, frees it; its size
//     std::size_t enumerate(const std::string& prefix);  // copies, frees the matches; their number
//     void putAndSave(const std::string& key, const std::string& value);
//
// Runs in a directory of its own, where it keeps the stores it has made: 'data-N' has N records.
#include "Measure.h"

#include <filesystem>
#include <map>
#include <memory>

namespace bench {

using Map = std::map<std::string, std::string>;

inline std::string key(unsigned i) {
    char text[32];
    std::snprintf(text, sizeof text, "k%015u", i);
    return text;
}

// 100 bytes that no compression makes smaller.
inline std::string value(unsigned i) {
    std::string bytes(100, '\0');
    std::uint64_t state = i + 0x9E3779B97F4A7C15u;
    for (char& byte : bytes) {
        state = state * 6364136223846793005u + 1442695040888963407u;
        byte = static_cast<char>(state >> 56);
    }
    return bytes;
}

inline Map records(unsigned n) {
    Map all;
    for (unsigned i = 0; i < n; ++i)
        all.emplace_hint(all.end(), key(i), value(i));
    return all;
}

// Keys in a random order that is the same for everybody, made before the clock runs.
inline std::vector<std::string> randomKeys(unsigned n, unsigned below, unsigned cutTo = 16) {
    std::vector<std::string> keys;
    std::uint64_t state = 1;
    for (unsigned i = 0; i < n; ++i) {
        state = state * 6364136223846793005u + 1442695040888963407u;
        keys.push_back(key(static_cast<unsigned>((state >> 33) % below)).substr(0, cutTo));
    }
    return keys;
}

// A copy of n bytes, as the contestants hand them to their callers.
inline std::unique_ptr<char[]> copyOf(const void* from, std::size_t n) {
    std::unique_ptr<char[]> copy(new char[n]);
    std::memcpy(copy.get(), from, n);
    asm volatile("" : : "r"(copy.get()) : "memory");  // somebody looks at it
    return copy;
}

// Keys and values of the records that were found.
using Found = std::vector<std::pair<std::unique_ptr<char[]>, std::unique_ptr<char[]>>>;

// For a contestant that works in its files: what it loads goes into a map, from which it saves.
struct Holder {
    Map held;
    void hold(const Map& all) { held = all; }
};

inline void removeStore(const std::string& path) {
    for (const char* suffix : {"", "-lock", "-wal", "-shm"})
        std::filesystem::remove_all(path + suffix);
}

// The path of a store with n records, made now unless an earlier run did.
template <class C>
std::string storeOf(unsigned n) {
    const std::string path = "data-" + std::to_string(n);
    if (std::filesystem::exists(path + ".made")) return path;
    inChild([&] {  // so that making it is not seen in this process's peak
        removeStore(path);
        C store;
        store.hold(records(n));
        store.open(path);
        store.save();
        return 0.0;
    });
    std::fclose(std::fopen((path + ".made").c_str(), "w"));
    return path;
}

template <class C>
double loadOnce(const std::string& path) {
    C store;
    const std::uint64_t begin = now();
    store.open(path);
    store.load();
    return static_cast<double>(now() - begin);
}

template <class C>
double saveOnce(const Map& all, const std::string& path) {
    removeStore(path);
    C store;
    store.hold(all);
    const std::uint64_t begin = now();
    store.open(path);
    store.save();
    return static_cast<double>(now() - begin);
}

// In a child process each, since a process loads its store once. A store of one record goes first:
// it brings in the code, and what is done once in a process.
template <class C>
double loads(unsigned n, const std::string& path) {
    const std::string warm = storeOf<C>(1);
    return inChildren(n, [&] {
        loadOnce<C>(warm);
        return loadOnce<C>(path);
    });
}

template <class C>
double saves(unsigned n, const Map& all) {
    return inChildren(n, [&] {
        saveOnce<C>({*all.begin()}, "warm");
        return saveOnce<C>(all, "saved");
    });
}

template <class C>
int storeMain(int argc, char** argv) {
    const Row row(argc, argv);
    const unsigned n = row.n;
    if (row.name == "save") {
        report("ns", saves<C>(n, records(row.number)) / row.number);
        return 0;
    }
    const std::string path = storeOf<C>(row.number);
    if (row.name == "load") {
        report("ns", loads<C>(n, path) / row.number);
        return 0;
    }
    C store;
    store.open(path);
    if (row.name == "memory") {
        perCall(1, [&store](unsigned) { store.load(); });
        report("mib", peakMiB());
        return 0;
    }
    store.load();
    if (row.name == "put") {
        const std::vector<std::string> keys = randomKeys(n, row.number);
        const std::string bytes = value(7);
        report("ns", perCall(n, [&](unsigned i) { store.putAndSave(keys[i], bytes); }));
    } else {
        const bool get = row.name == "get";
        const std::vector<std::string> keys = randomKeys(n, row.number, get ? 16 : 15);
        std::size_t sum = 0;
        const auto work = [&](unsigned i) {
            sum += get ? store.get(keys[i]) : store.enumerate(keys[i]);
        };
        const double ns = perCall(n, work);
        if (sum != n * std::size_t{get ? 100u : 10u}) giveUp("not all records were found");
        report("ns", ns);
    }
    return 0;
}

}  // namespace bench
