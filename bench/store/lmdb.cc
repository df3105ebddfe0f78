#include "../support/StoreRows.h"

#include <lmdb.h>

namespace {

void check(int result) {
    if (result != 0) bench::giveUp(mdb_strerror(result));
}

MDB_val val(const std::string& text) {
    return {text.size(), const_cast<char*>(text.data())};
}

std::string text(const MDB_val& val) {
    return std::string(static_cast<const char*>(val.mv_data), val.mv_size);
}

class Lmdb : public bench::Holder {
  public:
    void open(const std::string& path) {
        check(mdb_env_create(&_env));
        check(mdb_env_set_mapsize(_env, std::size_t{1} << 30));
        check(mdb_env_open(_env, path.c_str(), MDB_NOSUBDIR | MDB_NOSYNC, 0600));
        MDB_txn* txn = nullptr;
        check(mdb_txn_begin(_env, nullptr, 0, &txn));
        check(mdb_dbi_open(txn, nullptr, 0, &_dbi));
        check(mdb_txn_commit(txn));
        check(mdb_txn_begin(_env, nullptr, MDB_RDONLY, &_reading));
        check(mdb_cursor_open(_reading, _dbi, &_cursor));
        mdb_txn_reset(_reading);
    }
    Lmdb() = default;
    Lmdb(const Lmdb&) = delete;
    ~Lmdb() {
        mdb_cursor_close(_cursor);
        mdb_txn_abort(_reading);
        mdb_env_close(_env);
    }

    void load() {
        look();
        MDB_val key;
        MDB_val value;
        while (mdb_cursor_get(_cursor, &key, &value, MDB_NEXT) == 0)
            held[text(key)] = text(value);
        mdb_txn_reset(_reading);
    }
    void save() {
        write([this](MDB_txn* txn) {
            for (const auto& [key, value] : held)
                put(txn, key, value, MDB_APPEND);
        });
    }
    std::size_t get(const std::string& key) {
        look();
        MDB_val wanted = val(key);
        MDB_val value;
        check(mdb_get(_reading, _dbi, &wanted, &value));
        bench::copyOf(value.mv_data, value.mv_size);
        mdb_txn_reset(_reading);
        return value.mv_size;
    }
    std::size_t enumerate(const std::string& prefix) {
        look();
        bench::Found matches;
        MDB_val key = val(prefix);
        MDB_val value;
        for (int op = MDB_SET_RANGE; mdb_cursor_get(_cursor, &key, &value, MDB_cursor_op(op)) == 0;
             op = MDB_NEXT) {
            if (key.mv_size < prefix.size() ||
                std::memcmp(key.mv_data, prefix.data(), prefix.size()) != 0)
                break;
            matches.emplace_back(bench::copyOf(key.mv_data, key.mv_size),
                                 bench::copyOf(value.mv_data, value.mv_size));
        }
        mdb_txn_reset(_reading);
        return matches.size();
    }
    void putAndSave(const std::string& key, const std::string& value) {
        write([&](MDB_txn* txn) { put(txn, key, value, 0); });
    }

  private:
    // Each look sees what was saved last.
    void look() {
        check(mdb_txn_renew(_reading));
        check(mdb_cursor_renew(_reading, _cursor));
    }
    template <class Work>
    void write(Work work) {
        MDB_txn* txn = nullptr;
        check(mdb_txn_begin(_env, nullptr, 0, &txn));
        work(txn);
        check(mdb_txn_commit(txn));
    }
    void put(MDB_txn* txn, const std::string& key, const std::string& value, unsigned flags) {
        MDB_val k = val(key);
        MDB_val v = val(value);
        check(mdb_put(txn, _dbi, &k, &v, flags));
    }

    MDB_env* _env = nullptr;
    MDB_dbi _dbi = 0;
    MDB_txn* _reading = nullptr;
    MDB_cursor* _cursor = nullptr;
};

}  // namespace

int main(int argc, char** argv) {
    return bench::storeMain<Lmdb>(argc, argv);
}
