#pragma once

#include <korvex/util/Logger.h>

#include <map>
#include <string>
#include <vector>

#include "util/Logger/ConfigReader.h"

// An appender that the file names. Its statements are those of its attributes, in the file's order.
struct Appender {
    std::string name;
    unsigned lineno;  // where it is first named
    const LogAppender* made;
    std::vector<ConfigStatement> attributes;
    std::vector<unsigned> declarations;   // the lines "appender.NAME=..."
    std::vector<const char*> complaints;  // what every start of a program would say of it
};

// A channel that the file speaks of: the root, or a category. Its statements are the lines that
// apply to it; of the root's, only the last one does.
struct Channel {
    std::string name;  // of a category
    const LogChannel* made;
    std::vector<ConfigStatement> statements;
};

// What a configuration comes to, as the library reads it. No log file is opened.
struct Configuration {
    // Appenders and channels are the process's own, so what was read before is gone with this.
    static Configuration read(const std::string& text, const Pathname& home);

    // Whether a category may name it.
    bool hasAppender(const std::string& name) const;

    const Appender* appenderOf(const LogAppender* made) const;
    // Where the channel's messages go, in order: never empty.
    static std::vector<const LogAppender*> destinations(const LogChannel& channel);
    static bool writesTo(const LogChannel& channel, const LogAppender& appender);
    // The appenders, and the root appender last.
    std::vector<const Appender*> everyAppender() const;
    // The lines that set the root's level and appenders, and the categories'.
    std::vector<const ConfigStatement*> appliedValues() const;
    bool isRefused(unsigned lineno) const { return parseErrors.count(lineno) > 0; }
    // The names of the channels that write to it.
    std::vector<std::string> users(const LogAppender& appender) const;
    // "MAIN", or "rootAppender".
    std::string nameOf(const LogAppender* made) const;

    Channel root;
    std::vector<Channel> categories;              // in the order in which they come into being
    std::vector<Appender> appenders;              // in the file's order
    Appender rootAppender;                        // not among the others
    std::map<unsigned, std::string> parseErrors;  // by line: what the library quotes
    unsigned openComment = ConfigLines::kNone;    // the line of a comment that never ends
};
