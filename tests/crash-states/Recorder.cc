#include "crash-states/Recorder.h"

#include <fcntl.h>
#include <sys/syscall.h>
#include <unistd.h>

#include <fstream>
#include <map>
#include <optional>
#include <stdexcept>
#include <utility>

#include "crash-states/Disk.h"
#include "crash-states/RealDirectory.h"
#include "crash-states/TracedChild.h"

namespace crashstates {

namespace {

// Any: nobody asks for what may be on the disk.
constexpr std::size_t kBlockSize = 4096;
constexpr NameOrder kOrder = NameOrder::OF_EACH;

std::string procOf(const SystemCall& call) {
    return "/proc/" + std::to_string(call.process);
}

std::string pathOf(const SystemCall& call, int descriptor) {
    return procOf(call) + "/fd/" + std::to_string(descriptor);
}

// The path as we can say it: what is relative, "self" and "/dev/fd" are the child's.
std::string pathOf(const SystemCall& call, int directory, const std::string& path) {
    for (const std::string own : {"/proc/self/", "/proc/thread-self/"}) {
        if (path.compare(0, own.size(), own) == 0) {
            return procOf(call) + "/" + path.substr(own.size());
        }
    }
    const std::string descriptors = "/dev/fd/";
    if (path.compare(0, descriptors.size(), descriptors) == 0) {
        return procOf(call) + "/fd/" + path.substr(descriptors.size());
    }
    if (!path.empty() && path[0] == '/') return path;
    return (directory == AT_FDCWD ? procOf(call) + "/cwd" : pathOf(call, directory)) + "/" + path;
}

// Where the next write of that descriptor goes.
std::uint64_t positionOf(const SystemCall& call, int descriptor) {
    std::ifstream info(procOf(call) + "/fdinfo/" + std::to_string(descriptor));
    std::string word;
    std::uint64_t position = 0;
    if (!(info >> word >> position) || word != "pos:") throw std::runtime_error("no position");
    return position;
}

// Turns system calls into events. What a call did is asked of the kernel while the child waits:
// which file a descriptor is, where it stands, what attributes a file has. So it does not matter
// by which of the many ways the child said it.
class Recorder {
  public:
    explicit Recorder(std::string directory)
        : _directory(std::move(directory)),
          _directoryId(fileIdOf(_directory)),
          _history{readDirectory(_directory, [this](const FileId& id) { return number(id); }), {}},
          _disk(_history.before, kBlockSize, kOrder) {}

    void onCall(const SystemCall& call) {
        const auto handler = handlers().find(call.number);
        if (handler != handlers().end()) handler->second(*this, call);
    }
    // After the last call.
    History finish() {
        const Directory left =
            readDirectory(_directory, [this](const FileId& id) { return number(id); });
        const Directory said = _disk.visible();
        if (left.names != said.names || left.files != said.files) {
            throw std::runtime_error("what was done in " + _directory + " cannot be recorded");
        }
        return std::move(_history);
    }

  private:
    using Handler = std::function<void(Recorder&, const SystemCall&)>;

    static const std::map<long, Handler>& handlers();
    static void addPathHandlers(std::map<long, Handler>& all);
    static void addAttributeHandlers(std::map<long, Handler>& all);

    void add(Event event) {
        _disk.apply(event);
        _history.events.push_back(std::move(event));
    }
    // The number of a file, a new one where it had none.
    Inode number(const FileId& id) {
        const auto [at, isNew] = _inodes.try_emplace(id, _next);
        if (isNew) ++_next;
        return at->second;
    }
    // A file that was seen in the directory.
    std::optional<Inode> known(const std::string& path) const {
        const auto found = _inodes.find(fileIdOf(path));
        return found == _inodes.end() ? std::nullopt : std::optional(found->second);
    }
    // The name, where that path is one in the directory.
    std::optional<std::string> nameOf(const std::string& path) const {
        const std::size_t slash = path.rfind('/');
        if (access(path.substr(0, slash).c_str(), F_OK) != 0) return std::nullopt;
        if (fileIdOf(path.substr(0, slash) + "/.") != _directoryId) return std::nullopt;
        return path.substr(slash + 1);
    }

    void opened(const SystemCall& call, const std::string& path, int flags);
    void createdAs(const std::string& name, const std::string& path);
    void wrote(const SystemCall& call, std::optional<std::uint64_t> offset);
    void resized(const SystemCall& call);
    void renamed(const std::string& from, const std::string& to);
    void linked(const std::string& path);
    void unlinked(const std::string& path);
    void synced(const SystemCall& call, bool dataOnly);
    void attributesMayHaveChanged(const std::string& path);

    const std::string _directory;
    const FileId _directoryId;
    Inode _next = 1;
    std::map<FileId, Inode> _inodes;
    History _history;
    Disk _disk;
};

void Recorder::opened(const SystemCall& call, const std::string& path, int flags) {
    const std::string file = pathOf(call, static_cast<int>(call.result));
    const auto name = nameOf(path);
    if ((flags & O_TMPFILE) == O_TMPFILE) {
        if (fileIdOf(path) == _directoryId) createdAs("", file);
    } else if ((flags & O_CREAT) != 0 && name && _disk.visibleNames().count(*name) == 0) {
        createdAs(*name, file);
    } else if ((flags & O_TRUNC) != 0) {
        const auto inode = known(file);
        if (inode && !_disk.visibleFile(*inode).bytes.empty()) add(Truncate{*inode, 0});
    }
}

// The file system may have used the number of a file that is gone.
void Recorder::createdAs(const std::string& name, const std::string& path) {
    const FileId id = fileIdOf(path);
    _inodes.erase(id);
    add(Create{name, number(id), attributesOf(path)});
}

void Recorder::wrote(const SystemCall& call, std::optional<std::uint64_t> offset) {
    const int descriptor = call.intArgument(0);
    const std::string path = pathOf(call, descriptor);
    const auto inode = known(path);
    const auto size = static_cast<std::uint64_t>(call.result);
    if (!inode || size == 0) return;
    const std::uint64_t from = offset ? *offset : positionOf(call, descriptor) - size;
    add(Write{*inode, from, bytesOf(path).substr(from, size)});
}

void Recorder::resized(const SystemCall& call) {
    const std::string path = pathOf(call, call.intArgument(0));
    const auto inode = known(path);
    if (inode) add(Truncate{*inode, bytesOf(path).size()});
}

void Recorder::renamed(const std::string& from, const std::string& to) {
    const auto oldName = nameOf(from);
    const auto newName = nameOf(to);
    if (oldName && newName) add(Rename{*oldName, *newName});
}

void Recorder::linked(const std::string& path) {
    const auto name = nameOf(path);
    const auto inode = name ? known(path) : std::nullopt;
    if (inode) add(Link{*inode, *name});
}

void Recorder::unlinked(const std::string& path) {
    const auto name = nameOf(path);
    if (name) add(Unlink{*name});
}

void Recorder::synced(const SystemCall& call, bool dataOnly) {
    const std::string path = pathOf(call, call.intArgument(0));
    const auto inode = known(path);
    if (inode) add(SyncFile{*inode, dataOnly});
    if (fileIdOf(path) == _directoryId) add(SyncDirectory{});
}

void Recorder::attributesMayHaveChanged(const std::string& path) {
    const auto inode = known(path);
    if (!inode) return;
    const Attributes before = _disk.visibleFile(*inode).attributes;
    const Attributes now = attributesOf(path);
    for (const auto& [name, value] : now) {
        const auto old = before.find(name);
        if (old == before.end() || old->second != value) add(SetAttribute{*inode, name, value});
    }
    for (const auto& entry : before) {
        if (now.count(entry.first) == 0) add(SetAttribute{*inode, entry.first, std::nullopt});
    }
}

const std::map<long, Recorder::Handler>& Recorder::handlers() {
    static const std::map<long, Handler> handlers = [] {
        std::map<long, Handler> all;
        addPathHandlers(all);
        addAttributeHandlers(all);
        const Handler write = [](Recorder& r, const SystemCall& c) { r.wrote(c, std::nullopt); };
        const Handler resize = [](Recorder& r, const SystemCall& c) { r.resized(c); };
        all[SYS_write] = all[SYS_writev] = write;
        all[SYS_ftruncate] = resize;
#ifdef SYS_ftruncate64
        all[SYS_ftruncate64] = resize;
#endif
        all[SYS_pwrite64] = [](Recorder& r, const SystemCall& c) { r.wrote(c, c.arguments[3]); };
        all[SYS_fsync] = [](Recorder& r, const SystemCall& c) { r.synced(c, false); };
        all[SYS_fdatasync] = [](Recorder& r, const SystemCall& c) { r.synced(c, true); };
        return all;
    }();
    return handlers;
}

// Some machines have only the newer calls, with a directory before each path.
void Recorder::addPathHandlers(std::map<long, Handler>& all) {
    using Call = const SystemCall&;
    const auto text = [](Call c, unsigned i) { return pathOf(c, AT_FDCWD, c.textArgument(i)); };
    const auto textAt = [](Call c, unsigned i) {
        return pathOf(c, c.intArgument(i), c.textArgument(i + 1));
    };
#ifdef SYS_open
    all[SYS_open] = [=](Recorder& r, Call c) { r.opened(c, text(c, 0), c.intArgument(1)); };
    all[SYS_creat] = [=](Recorder& r, Call c) { r.opened(c, text(c, 0), O_CREAT | O_TRUNC); };
    all[SYS_rename] = [=](Recorder& r, Call c) { r.renamed(text(c, 0), text(c, 1)); };
    all[SYS_link] = [=](Recorder& r, Call c) { r.linked(text(c, 1)); };
    all[SYS_unlink] = [=](Recorder& r, Call c) { r.unlinked(text(c, 0)); };
#endif
    all[SYS_openat] = [=](Recorder& r, Call c) { r.opened(c, textAt(c, 0), c.intArgument(2)); };
#ifdef SYS_renameat
    all[SYS_renameat] = [=](Recorder& r, Call c) { r.renamed(textAt(c, 0), textAt(c, 2)); };
#endif
    all[SYS_renameat2] = [=](Recorder& r, Call c) { r.renamed(textAt(c, 0), textAt(c, 2)); };
    all[SYS_linkat] = [=](Recorder& r, Call c) { r.linked(textAt(c, 2)); };
    all[SYS_unlinkat] = [=](Recorder& r, Call c) { r.unlinked(textAt(c, 0)); };
}

void Recorder::addAttributeHandlers(std::map<long, Handler>& all) {
    const Handler byDescriptor = [](Recorder& r, const SystemCall& c) {
        r.attributesMayHaveChanged(pathOf(c, c.intArgument(0)));
    };
    const Handler byPath = [](Recorder& r, const SystemCall& c) {
        r.attributesMayHaveChanged(pathOf(c, AT_FDCWD, c.textArgument(0)));
    };
    const Handler byPathAt = [](Recorder& r, const SystemCall& c) {
        r.attributesMayHaveChanged(pathOf(c, c.intArgument(0), c.textArgument(1)));
    };
    for (const long call : {SYS_fchmod, SYS_fchown, SYS_fsetxattr, SYS_fremovexattr})
        all[call] = byDescriptor;
    for (const long call : {SYS_setxattr, SYS_lsetxattr, SYS_removexattr, SYS_lremovexattr})
        all[call] = byPath;
#ifdef SYS_chmod
    for (const long call : {SYS_chmod, SYS_chown, SYS_lchown})
        all[call] = byPath;
#endif
#ifdef SYS_chown32
    for (const long call : {SYS_chown32, SYS_lchown32})
        all[call] = byPath;
    all[SYS_fchown32] = byDescriptor;
#endif
    for (const long call : {SYS_fchmodat, SYS_fchownat})
        all[call] = byPathAt;
}

}  // namespace

Recording record(const std::string& directory, const std::function<int()>& body) {
    Recorder recorder(directory);
    const int status = traceCalls(body, [&](const SystemCall& call) { recorder.onCall(call); });
    return {recorder.finish(), status};
}

}  // namespace crashstates
