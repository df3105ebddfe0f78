#include "../support/StoreRows.h"

#include <gdbm.h>

namespace {

datum datumOf(const std::string& text) {
    return {const_cast<char*>(text.data()), static_cast<int>(text.size())};
}

class Gdbm : public bench::Holder {
  public:
    Gdbm() = default;
    Gdbm(const Gdbm&) = delete;
    ~Gdbm() { gdbm_close(_file); }

    void open(const std::string& path) {
        _file = gdbm_open(path.c_str(), 0, GDBM_WRCREAT, 0600, nullptr);
        if (_file == nullptr) bench::giveUp("cannot open the store");
    }
    void load() {
        for (datum key = gdbm_firstkey(_file); key.dptr != nullptr;) {
            const datum value = gdbm_fetch(_file, key);
            held[std::string(key.dptr, static_cast<std::size_t>(key.dsize))] =
                std::string(value.dptr, static_cast<std::size_t>(value.dsize));
            const datum next = gdbm_nextkey(_file, key);
            std::free(value.dptr);
            std::free(key.dptr);
            key = next;
        }
    }
    void save() {
        for (const auto& [key, value] : held)
            put(key, value);
    }
    std::size_t get(const std::string& key) {
        const datum value = gdbm_fetch(_file, datumOf(key));  // a copy already
        std::free(value.dptr);
        return static_cast<std::size_t>(value.dsize);
    }
    std::size_t enumerate(const std::string&) { bench::unsupported(); }  // a hash has no order
    void putAndSave(const std::string& key, const std::string& value) { put(key, value); }

  private:
    void put(const std::string& key, const std::string& value) {
        if (gdbm_store(_file, datumOf(key), datumOf(value), GDBM_REPLACE) != 0)
            bench::giveUp("cannot put into the store");
    }
    GDBM_FILE _file = nullptr;
};

}  // namespace

int main(int argc, char** argv) {
    return bench::storeMain<Gdbm>(argc, argv);
}
