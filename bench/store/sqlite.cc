// With synchronous=OFF; sqlite-wal.cc has it with a write-ahead log.
#include "../support/StoreRows.h"

#include <sqlite3.h>

namespace {

#ifdef BENCH_WAL
constexpr const char* kMode = "PRAGMA journal_mode=WAL; PRAGMA synchronous=NORMAL";
#else
constexpr const char* kMode = "PRAGMA synchronous=OFF";
#endif

class Sqlite : public bench::Holder {
  public:
    Sqlite() = default;
    Sqlite(const Sqlite&) = delete;
    ~Sqlite() {
        for (sqlite3_stmt* statement : {_all, _get, _range, _put})
            sqlite3_finalize(statement);
        sqlite3_close(_db);
    }

    void open(const std::string& path) {
        if (sqlite3_open(path.c_str(), &_db) != SQLITE_OK) bench::giveUp("cannot open the store");
        run(kMode);
        run("CREATE TABLE IF NOT EXISTS records(key TEXT PRIMARY KEY, value BLOB) WITHOUT ROWID");
        _all = prepare("SELECT key, value FROM records");
        _get = prepare("SELECT value FROM records WHERE key = ?1");
        _range = prepare("SELECT key, value FROM records WHERE key >= ?1 ORDER BY key");
        _put = prepare("INSERT OR REPLACE INTO records VALUES(?1, ?2)");
    }
    void load() {
        while (sqlite3_step(_all) == SQLITE_ROW)
            held[text(_all, 0)] = text(_all, 1);
        sqlite3_reset(_all);
    }
    void save() {
        run("BEGIN");
        for (const auto& [key, value] : held)
            put(key, value);
        run("COMMIT");
    }
    std::size_t get(const std::string& key) {
        bind(_get, 1, key);
        if (sqlite3_step(_get) != SQLITE_ROW) return 0;
        const auto size = static_cast<std::size_t>(sqlite3_column_bytes(_get, 0));
        bench::copyOf(sqlite3_column_blob(_get, 0), size);
        sqlite3_reset(_get);
        return size;
    }
    std::size_t enumerate(const std::string& prefix) {
        bench::Found matches;
        bind(_range, 1, prefix);
        while (sqlite3_step(_range) == SQLITE_ROW) {
            const auto size = static_cast<std::size_t>(sqlite3_column_bytes(_range, 0));
            const void* const key = sqlite3_column_blob(_range, 0);
            if (size < prefix.size() || std::memcmp(key, prefix.data(), prefix.size()) != 0) break;
            matches.emplace_back(
                bench::copyOf(key, size),
                bench::copyOf(sqlite3_column_blob(_range, 1),
                              static_cast<std::size_t>(sqlite3_column_bytes(_range, 1))));
        }
        sqlite3_reset(_range);
        return matches.size();
    }
    void putAndSave(const std::string& key, const std::string& value) { put(key, value); }

  private:
    void run(const char* sql) {
        if (sqlite3_exec(_db, sql, nullptr, nullptr, nullptr) != SQLITE_OK)
            bench::giveUp(sqlite3_errmsg(_db));
    }
    sqlite3_stmt* prepare(const char* sql) {
        sqlite3_stmt* statement = nullptr;
        if (sqlite3_prepare_v2(_db, sql, -1, &statement, nullptr) != SQLITE_OK)
            bench::giveUp(sqlite3_errmsg(_db));
        return statement;
    }
    static void bind(sqlite3_stmt* statement, int at, const std::string& text) {
        sqlite3_bind_text(statement, at, text.data(), static_cast<int>(text.size()), nullptr);
    }
    static std::string text(sqlite3_stmt* statement, int column) {
        const auto* const bytes = static_cast<const char*>(sqlite3_column_blob(statement, column));
        return std::string(bytes,
                           static_cast<std::size_t>(sqlite3_column_bytes(statement, column)));
    }
    void put(const std::string& key, const std::string& value) {
        bind(_put, 1, key);
        sqlite3_bind_blob(_put, 2, value.data(), static_cast<int>(value.size()), nullptr);
        if (sqlite3_step(_put) != SQLITE_DONE) bench::giveUp(sqlite3_errmsg(_db));
        sqlite3_reset(_put);
    }

    sqlite3* _db = nullptr;
    sqlite3_stmt* _all = nullptr;
    sqlite3_stmt* _get = nullptr;
    sqlite3_stmt* _range = nullptr;
    sqlite3_stmt* _put = nullptr;
};

}  // namespace

int main(int argc, char** argv) {
    return bench::storeMain<Sqlite>(argc, argv);
}
