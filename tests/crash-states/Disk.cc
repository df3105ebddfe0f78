#include "crash-states/Disk.h"

namespace crashstates {

struct Disk::Applier {
    Disk& disk;

    FileModel& file(Inode inode) const { return disk._files.at(inode); }

    void operator()(const Create& e) const {
        disk._files.emplace(e.inode, FileModel({"", e.attributes}, disk._blockSize));
        if (!e.name.empty()) disk._directory.enter(e.name, e.inode);
    }
    void operator()(const Write& e) const { file(e.inode).write(e.offset, e.bytes); }
    void operator()(const Truncate& e) const { file(e.inode).truncate(e.size); }
    void operator()(const SetAttribute& e) const { file(e.inode).setAttribute(e.name, e.value); }
    void operator()(const Link& e) const { disk._directory.enter(e.name, e.inode); }
    void operator()(const Rename& e) const { disk._directory.rename(e.from, e.to); }
    void operator()(const Unlink& e) const { disk._directory.unlink(e.name); }
    void operator()(const SyncFile& e) const { file(e.inode).sync(e.dataOnly); }
    void operator()(const SyncDirectory&) const { disk._directory.sync(); }
};

Disk::Disk(const Directory& durable, std::size_t blockSize, NameOrder order)
    : _blockSize(blockSize), _directory(durable.names, order) {
    for (const auto& [inode, file] : durable.files)
        _files.emplace(inode, FileModel(file, blockSize));
}

void Disk::apply(const Event& event) {
    std::visit(Applier{*this}, event);
}

Directory Disk::visible() const {
    Directory directory;
    directory.names = visibleNames();
    for (const auto& entry : directory.names)
        directory.files[entry.second] = visibleFile(entry.second);
    return directory;
}

}  // namespace crashstates
