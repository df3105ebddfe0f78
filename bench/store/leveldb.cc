#include "../support/StoreRows.h"

#include <leveldb/db.h>
#include <leveldb/write_batch.h>

namespace {

void check(const leveldb::Status& status) {
    if (!status.ok()) bench::giveUp(status.ToString().c_str());
}

class Leveldb : public bench::Holder {
  public:
    void open(const std::string& path) {
        leveldb::Options options;
        options.create_if_missing = true;
        leveldb::DB* db = nullptr;
        check(leveldb::DB::Open(options, path, &db));
        _db.reset(db);
    }
    void load() {
        const std::unique_ptr<leveldb::Iterator> it(_db->NewIterator({}));
        for (it->SeekToFirst(); it->Valid(); it->Next())
            held[it->key().ToString()] = it->value().ToString();
    }
    void save() {
        leveldb::WriteBatch batch;
        unsigned n = 0;
        for (const auto& [key, value] : held) {
            batch.Put(key, value);
            if (++n % 1000 == 0) writeOut(batch);  // one batch is kept in memory whole
        }
        writeOut(batch);
    }
    std::size_t get(const std::string& key) {
        std::string value;
        check(_db->Get({}, key, &value));
        return value.size();
    }
    std::size_t enumerate(const std::string& prefix) {
        bench::Found matches;
        const std::unique_ptr<leveldb::Iterator> it(_db->NewIterator({}));
        for (it->Seek(prefix); it->Valid() && it->key().starts_with(prefix); it->Next())
            matches.emplace_back(bench::copyOf(it->key().data(), it->key().size()),
                                 bench::copyOf(it->value().data(), it->value().size()));
        return matches.size();
    }
    void putAndSave(const std::string& key, const std::string& value) {
        check(_db->Put({}, key, value));
    }

  private:
    void writeOut(leveldb::WriteBatch& batch) {
        check(_db->Write({}, &batch));
        batch.Clear();
    }
    std::unique_ptr<leveldb::DB> _db;
};

}  // namespace

int main(int argc, char** argv) {
    return bench::storeMain<Leveldb>(argc, argv);
}
