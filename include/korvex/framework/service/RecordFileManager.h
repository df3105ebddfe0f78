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

// One value on its way into or out of the store. Owns nothing: see RecordFileManager::get.
struct PersistentHashData {
    void* _pData = nullptr;   // the bytes
    std::uint32_t _size = 0;  // how many
};

// One record that RecordFileManager::enumerate gave away. Its receiver frees both blocks, with
// delete[] static_cast<char*>(p); copies share them.
struct PersistentFullData {
    void* _pData = nullptr;       // a copy of the value
    std::uint32_t _dataSize = 0;  // its length in bytes
    void* _pKey = nullptr;        // a copy of the key, NUL-terminated
    std::uint32_t _keySize = 0;   // its length in bytes, without the NUL
};

// A process-wide map from string keys to small opaque values (see StringStore.h for an interface
// with strings, which leaves nothing to free), kept in memory and mirrored in one
// record file, which is read whole and rewritten whole. All messages go to the logger
// "recordFileManager". Errors that make the store unusable throw ComponentException; the others
// are logged and the call returns.
//
// Threads: put() may be called from several at once. Everything else must be serialised by the
// callers; the first instance() comes before other threads use the store. One process at a time
// should use a file: nothing locks it.
//
// A child of fork(2) may use the store, of which it has its own copy, whatever put() calls were
// under way in the parent's other threads; its file is the parent's still, so it should name its
// own. Other calls that were under way in other threads may have left the copy half changed: such
// a child must not use the store. Whatever was under way, it may exit(3): the parent's save is
// not disturbed.
//
// What it does not promise: a save rewrites the file in place, without fsync(2), so a crash, an
// exit(3) in another thread or a full disk in its middle leaves the file cut: a beginning of what
// was to be saved, and nothing else (memory is never touched by a failed save). A value that put()
// replaces is never freed. A key is NUL-terminated when it is loaded: one with an embedded NUL
// comes back shortened. Keys that begin with
// "_record-file-version" in any case are taken for the file's version and do not come back at all.
class RecordFileManager {
  public:
    // The one instance, built at the first call and never destroyed.
    static RecordFileManager* instance();

    RecordFileManager(const RecordFileManager&) = delete;
    RecordFileManager& operator=(const RecordFileManager&) = delete;
    virtual ~RecordFileManager() noexcept(false);

    // Names the record file. Reads nothing.
    void setDBFile(Pathname path);
    // Names the file hashDb/data below LoaderInfo's database directory and reads it. The node is
    // not looked at. Throws what readFile() throws.
    void init(const XmlNode& node);

    // Stores a copy of the value under the key, replacing the one it had, and saves everything if
    // writeToFile is true. The key "_record-file-version" is refused with a logged error. Throws
    // ComponentException "Unable to allocate memory for storing hash value.", the store being as
    // it was (a key of 4 GiB is refused so too), and what saveToFile() throws, the value being
    // stored.
    void put(const std::string& key, const PersistentHashData& data, bool writeToFile)
        KORVEX_EXCLUDES(_mutex);
    // Hands out a copy of the value, which the caller frees with delete[] static_cast<char*>(p);
    // never null, even for a value of size 0. For an absent key _pData is null and _size untouched.
    void get(const std::string& key, PersistentHashData& dataToReturn) const;
    // Removes the record and saves everything; false, and nothing saved, when the key is absent.
    // Throws what saveToFile() throws, the record being gone.
    bool remove(const std::string& key);
    // The same, but saves only if writeToFile is true: for removing several with one save, the last
    // one's.
    bool remove(const std::string& key, bool writeToFile);
    // Appends copies of the records whose keys begin with partialKey, in byte-wise key order; ""
    // matches all. Whether there was any. See PersistentFullData for who frees.
    bool enumerate(const std::string& partialKey,
                   std::vector<PersistentFullData>& listToReturn) const;

    // Adds the file's records to those in memory. A file that cannot be opened is silently none.
    // One that is cut short is told by logged errors; what was read before stays, and a value cut
    // short is stored with its full length, zero bytes where there was nothing to read. Throws
    // ComponentException when memory for a key or a value runs out (std::bad_alloc when it is the
    // map's), and when a cut file held no version record.
    void readFile();
    // The same for those records of another file whose keys begin with the prefix. Saves nothing
    // and leaves this store's file and version alone.
    void preload(const std::string& prefix, const Pathname& file);
    // Rewrites the record file: the version record, then all records in key order. Failures to
    // open, write or close it are logged; after a failed write the file is a beginning of what was
    // to be saved. The process's umask is 066 afterwards, and stays so: later files, log files
    // among them, become 0600. Throws ComponentException when no file is named.
    void saveToFile();

    // Steps of the above, for tests and tools.
    //
    // Fills buf with readLen bytes, in pieces of 1000; what could not be read is logged and left
    // untouched in buf.
    void readLooped(char* buf, unsigned int readLen, std::FILE* inFile);
    // Writes one record; whether all of it was accepted by the stream.
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
