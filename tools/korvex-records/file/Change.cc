#include "file/Change.h"

#include <fcntl.h>
#include <unistd.h>

#include <cstdlib>
#include <memory>

#include "file/Lock.h"
#include "file/NewFile.h"
#include "file/RecordPath.h"
#include "terminal/Progress.h"
#include "text/Counted.h"
#include "text/Escape.h"

namespace {

// Through symbolic links, because it is the file itself that is replaced.
Pathname resolved(const Pathname& name) {
    const std::unique_ptr<char, decltype(&std::free)> real(realpath(name.c_str(), nullptr),
                                                           &std::free);
    if (!real) throw Failure(IO_ERROR, withErrno("cannot resolve " + name));
    return Pathname(real.get());
}

bool create(const Pathname& name, const RecordMemory& memory) {
    const Pathname directory = directoryOf(name);
    sweep(directory, nullptr);
    NewFile file(directory);
    file.save(memory, name);
    return file.becomes(name);
}

void refuseFurtherLinks(const OpenFile& file) {
    const auto further = static_cast<unsigned long>(file.stat().st_nlink) - 1;
    if (further == 0) return;
    throw Failure(IO_ERROR, file.name() + ": has " + counted(further, "further hard link") +
                                ", which would keep the old records; not written to");
}

// Throws unless the file is one that can be changed without a loss.
void scanForChange(const OpenFile& file, bool anyVersion, std::uint64_t& records) {
    progressStep("scanning", file.size());
    StrictReader reader = file.reader();
    while (reader.next())
        continue;
    const Scan& found = reader.found();
    if (!found.whole()) {
        throw Failure(DAMAGED, damage(file.name(), found) +
                                   "; not written to (salvage writes what is whole elsewhere)");
    }
    if (!anyVersion) requireOwnVersion(file.name(), found.version);
    records = found.records;
}

// Through the very descriptor that was scanned. The store passes over what it cannot read, and a
// change on top of that would lose it for good.
void load(const OpenFile& file, std::uint64_t records, RecordMemory& memory) {
    const Pathname path("/dev/fd/" + std::to_string(file.fd()));
    if (!path.r_ok()) throw Failure(IO_ERROR, withErrno("cannot read " + path));
    progressStep("loading");
    memory.load(path, records);
    progressStep("comparing", file.size());
    StrictReader reader = file.reader();
    while (reader.next()) {
        if (!memory.holds(reader.key(), reader.value())) {
            throw Failure(IO_ERROR, "cannot load all of " + file.name() + " (the log says why)");
        }
    }
}

bool changeFile(const Pathname& name, const Options& options, const Change& change,
                const Patience& patience) {
    OpenFile old(resolved(name), options.dryRun ? O_RDONLY : O_RDWR);
    if (!options.dryRun) {
        if (!lock(old, patience)) return false;
        sweep(directoryOf(old.name()), &old);
        old.refresh();
        refuseFurtherLinks(old);
    }
    std::uint64_t records = 0;
    scanForChange(old, options.anyVersion, records);
    RecordMemory memory;
    if (!change.startsEmpty) load(old, records, memory);
    if (!change.make(memory, &old) || options.dryRun) return true;
    NewFile file(directoryOf(old.name()));
    file.save(memory, old.name());
    file.replace(old);
    return true;
}

// False when another run was first, so that all begins again.
bool attempt(const Pathname& name, const Options& options, const Change& change,
             const Patience& patience) {
    if (isThere(name)) return changeFile(name, options, change, patience);
    if (!change.mayCreate) throw Failure(IO_ERROR, name + ": no such file");
    RecordMemory memory;
    if (!change.make(memory, nullptr) || options.dryRun) return true;
    makeRecordDirectory(options);
    return create(name, memory);
}

}  // namespace

void changeRecordFile(const Options& options, const Change& change) {
    const Pathname name = recordFilePath(options);
    const Patience patience(options.wait);
    while (!attempt(name, options, change, patience))
        continue;
}

void requireOwnVersion(const Pathname& name, const std::string& version) {
    if (version.empty() || version == kVersion) return;
    throw Failure(IO_ERROR, name + ": its version is \"" + escaped(version) + "\", not \"" +
                                std::string(kVersion) + "\"; not written without --any-version");
}

void createRecordFile(const Pathname& name, const RecordMemory& memory) {
    if (isThere(name) || !create(name, memory)) {
        throw Failure(IO_ERROR, name + ": is there already; not written to");
    }
}
