#pragma once

#include <korvex/Export.h>
#include <korvex/XmlNode.h>
#include <korvex/util/Pathname.h>
#include <korvex/util/ThreadObj.h>

#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

KORVEX_NAMESPACE(korvex) {

// One value that is passed to or from the store. Owns nothing; see RecordFileManager::get.
struct PersistentHashData {
    void* _pData = nullptr;   // the bytes
    std::uint32_t _size = 0;  // how many
};

// One record from RecordFileManager::enumerate. The caller frees both blocks, with
// delete[] static_cast<char*>(p). Copies of this struct share them.
struct PersistentFullData {
    void* _pData = nullptr;       // a copy of the value
    std::uint32_t _dataSize = 0;  // its length in bytes
    void* _pKey = nullptr;        // a copy of the key, NUL-terminated
    std::uint32_t _keySize = 0;   // its length in bytes, without the NUL
};

// A process-wide map from string keys to small opaque values. It is kept in memory and mirrored in
// one record file, which is read as a whole and rewritten as a whole. (StringStore.h has an
// interface with strings, where nothing must be freed.) All messages go to the logger
// "recordFileManager". Errors that make the store unusable throw ComponentException; other errors
// are logged, and the call returns.
//
// Threads: several threads may call put() at once. The callers must serialise all other calls. Call
// instance() for the first time before other threads use the store. Only one process at a time
// should use a file: nothing locks it.
//
// Fork: a child of fork(2) has its own copy of the store and may use it, even if other threads of
// the parent were in put(). It should name a file of its own, because it still has the name of the
// parent's file. If other threads of the parent were in any other call, the copy may be half
// changed, and the child must not use it. The child may call exit(3) in all cases; that does not
// disturb a save of the parent.
//
// What it does not guarantee: a save rewrites the file in place, without fsync(2). A crash, a full
// disk, or an exit(3) in another thread during a save leaves only the first part of the new
// content. (A failed save does not change memory.) A value that put() replaces is never freed. A
// key that is loaded ends at its first NUL byte. A record whose key begins with
// "_record-file-version", in upper or lower case, is taken for the version of the file and is not
// loaded.
class RecordFileManager {
  public:
    // The one instance, built at the first call and never destroyed.
    static RecordFileManager* instance();

    RecordFileManager(const RecordFileManager&) = delete;
    RecordFileManager& operator=(const RecordFileManager&) = delete;
    virtual ~RecordFileManager() noexcept(false);

    // Names the record file. Reads nothing.
    void setDBFile(Pathname path);
    // Names the file hashDb/data below LoaderInfo's database directory, and reads it. The node is
    // not used. Throws what readFile() throws.
    void init(const XmlNode& node);

    // Stores a copy of the value under the key, in place of the present value, and saves everything
    // if writeToFile is true. The key "_record-file-version" is refused; that is logged as an
    // error. Throws ComponentException "Unable to allocate memory for storing hash value." if
    // memory runs out or the key has 4 GiB; then the store is unchanged. Throws what saveToFile()
    // throws; then the value is stored.
    void put(const std::string& key, const PersistentHashData& data, bool writeToFile)
        KORVEX_EXCLUDES(_mutex);
    // Returns a copy of the value, which the caller frees with delete[] static_cast<char*>(p). It
    // is not null, even for a value of size 0. For an absent key, _pData is null and _size
    // untouched.
    void get(const std::string& key, PersistentHashData& dataToReturn) const;
    // Removes the record and saves everything. False, with nothing saved, if the key is absent.
    // Throws what saveToFile() throws; then the record is removed.
    bool remove(const std::string& key);
    // The same, but saves only if writeToFile is true. To remove several records with one save,
    // pass true with the last one.
    bool remove(const std::string& key, bool writeToFile);
    // Appends copies of the records whose keys begin with partialKey, in byte-wise key order. ""
    // matches all keys. Returns whether there was any. The caller frees them; see
    // PersistentFullData.
    bool enumerate(const std::string& partialKey,
                   std::vector<PersistentFullData>& listToReturn) const;

    // Adds the records of the file to those in memory. A file that cannot be opened counts as
    // empty; nothing is logged. For a file that is cut short, errors are logged, and the records
    // before the cut stay. A value that is cut short is stored with its full length; the missing
    // bytes are zero. Throws ComponentException if memory for a key or a value runs out
    // (std::bad_alloc if it is memory for the map), and if a value is cut short and no version
    // record came before it.
    void readFile();
    // The same for those records of another file whose keys begin with the prefix. Saves nothing,
    // and does not change the file name and the version of this store.
    void preload(const std::string& prefix, const Pathname& file);
    // Rewrites the record file: the version record, then all records in key order. Failures to
    // open, write or close it are logged. After a failed write the file holds only the first part
    // of the new content. Sets the umask of the process to 066 and leaves it so: files that are
    // created later, log files included, have mode 0600. Throws ComponentException if no file is
    // named.
    void saveToFile();

    // Steps of the above, for tests and tools.
    //
    // Reads readLen bytes into buf, in pieces of 1000. If bytes are missing, logs it and leaves
    // their place in buf untouched.
    void readLooped(char* buf, unsigned int readLen, std::FILE* inFile);
    // Writes one record. Returns whether the stream accepted all of it.
    bool writeRecord(std::FILE* outFile, std::string key, unsigned int dataLen, const void* data);

  private:
    friend class StringStore;

    struct State;

    RecordFileManager();

    void load(const Pathname& file, const std::string& prefix, std::string& version);
    void enter(std::string_view key, std::string_view value);
    bool save() const;

    static RecordFileManager* __pInstance;

    Mutex _mutex;  // serialises put()
    const std::unique_ptr<State> _state;
};

}  // KORVEX_NAMESPACE(korvex)
