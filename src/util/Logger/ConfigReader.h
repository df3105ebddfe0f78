#pragma once

#include <korvex/util/Pathname.h>

#include "util/Logger/ConfigLines.h"

#include <list>
#include <string>

inline namespace korvex {

class LogAppender;

// A piece of the configuration kept for later: a category's definition, or what a parse error
// quotes.
struct DeferedLogConf {
    unsigned lineno;
    std::string context;
};

using DeferedLogConfList = std::list<DeferedLogConf>;

// Reads a logging configuration line by line. Appenders take shape at once. Root and categories
// are applied at the end, because a new channel copies the root's final state and may name
// appenders that are defined further down.
class ConfigReader {
  public:
    // Reads from `file`, which it does not own; korvexHome replaces "${KORVEX_HOME}".
    ConfigReader(std::FILE* file, const Pathname& korvexHome);

    void readAll();
    void applyRoot();
    void applyCategories();

    const DeferedLogConfList& parse_errors() const { return _parseErrors; }
    unsigned xml_comment_startline() const { return _lines.xml_comment_startline(); }

  private:
    void readLine(const std::string& line);
    void readRootCategory(const std::string& line, std::size_t key, std::size_t afterKey);
    void readAppender(const std::string& line, std::size_t name);
    void readAttribute(const std::string& line, std::size_t name, LogAppender& la);
    void addParseError(const std::string& line, std::size_t from);

    ConfigLines _lines;
    const Pathname& _korvexHome;
    DeferedLogConf root_cnf{0, {}};
    DeferedLogConfList cat_cnf;
    DeferedLogConfList _parseErrors;
};

}  // namespace korvex
