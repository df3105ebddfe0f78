// What anyone must do who keeps his records in a map: one read and one write of the whole file.
#include "../support/StoreRows.h"

#include <fcntl.h>
#include <sys/stat.h>

namespace {

std::uint32_t lengthAt(const char* at) {
    std::uint32_t length;
    std::memcpy(&length, at, sizeof length);
    return length;
}

void append(std::string& out, const std::string& field) {
    const auto length = static_cast<std::uint32_t>(field.size());
    out.append(reinterpret_cast<const char*>(&length), sizeof length);
    out += field;
}

class Floor {
  public:
    void open(const std::string& path) { _path = path; }

    void load() {
        const int fd = ::open(_path.c_str(), O_RDONLY);
        struct stat st;
        if (fd < 0 || fstat(fd, &st) != 0) bench::giveUp("cannot open the store");
        const auto size = static_cast<std::size_t>(st.st_size);
        const std::unique_ptr<char[]> all(new char[size]);
        if (read(fd, all.get(), size) != st.st_size) bench::giveUp("cannot read the store");
        close(fd);
        for (const char* at = all.get(); at < all.get() + size;) {
            std::string key(at + 4, lengthAt(at));
            at += 4 + key.size();
            _records[std::move(key)] = std::string(at + 4, lengthAt(at));
            at += 4 + lengthAt(at);
        }
    }
    void hold(const bench::Map& all) { _records = all; }
    void save() {
        std::string out;
        for (const auto& [key, value] : _records) {
            append(out, key);
            append(out, value);
        }
        const int fd = ::open(_path.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600);
        if (write(fd, out.data(), out.size()) != static_cast<ssize_t>(out.size()))
            bench::giveUp("cannot write the store");
        close(fd);
    }
    std::size_t get(const std::string& key) {
        const auto found = _records.find(key);
        bench::copyOf(found->second.data(), found->second.size());
        return found->second.size();
    }
    std::size_t enumerate(const std::string& prefix) {
        bench::Found matches;
        for (auto it = _records.lower_bound(prefix);
             it != _records.end() && it->first.compare(0, prefix.size(), prefix) == 0; ++it)
            matches.emplace_back(bench::copyOf(it->first.c_str(), it->first.size() + 1),
                                 bench::copyOf(it->second.data(), it->second.size()));
        return matches.size();
    }
    void putAndSave(const std::string& key, const std::string& value) {
        _records[key] = value;
        save();
    }

  private:
    std::string _path;
    bench::Map _records;
};

}  // namespace

int main(int argc, char** argv) {
    return bench::storeMain<Floor>(argc, argv);
}
