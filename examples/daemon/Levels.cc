#include "Levels.h"

#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Logger.h>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <sstream>
#include <stdexcept>
#include <string>

#include "Failure.h"

namespace {

Logger logger("tallyd");

constexpr std::size_t kMaxSize = 4096;

std::string contentOf(const Pathname& file) {
    // A FIFO shall not keep us, nor a link lead elsewhere.
    const int flags = O_RDONLY | O_CLOEXEC | O_NOFOLLOW | O_NONBLOCK;
    const ScopedFileDescriptor fd(FileDescriptor(open(file.c_str(), flags)));
    struct stat st {};
    if (!fd.valid() || fstat(fd.osdep(), &st) != 0) throw systemFailure("cannot read " + file);
    const bool ours = st.st_uid == geteuid() || st.st_uid == 0;
    if (!S_ISREG(st.st_mode) || !ours || (st.st_mode & (S_IWGRP | S_IWOTH)) != 0) {
        throw std::runtime_error(file + " is refused: others may write to it, or it is no file");
    }
    std::string content(kMaxSize, '\0');
    const ssize_t size = fd.read(content.data(), content.size());
    if (size < 0) throw systemFailure("cannot read " + file);
    content.resize(static_cast<std::size_t>(size));
    return content;
}

// A logger whose category was not configured when logging was set up is bound to the root's channel
// for good: a new channel of its name would be nobody's.
bool isConfigured(const std::string& channel) {
    const LogChannel* const root = LogChannel::find("*", false);
    return LogChannel::find(channel, false) != root;
}

void setLevel(const std::string& channel, const std::string& level) {
    if (channel != "*" && !isConfigured(channel)) {
        return logger.warn("no category " + channel + " in the configuration");
    }
    if (!Logger::setChannelLevel(channel == "*" ? nullptr : channel.c_str(), level)) {
        return logger.warn("no level " + level + " for " + channel);
    }
    logger.warn("the level of " + channel + " is " + level + " now");
}

}  // namespace

void Levels::apply() const try {
    std::istringstream lines(contentOf(_file));
    for (std::string line; std::getline(lines, line);) {
        std::istringstream words(line);
        std::string channel;
        std::string level;
        if (words >> channel >> level) setLevel(channel, level);
    }
} catch (const std::exception& e) {
    logger.warn(e);
}
