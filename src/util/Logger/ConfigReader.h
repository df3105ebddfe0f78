#pragma once

#include <korvex/util/Pathname.h>

#include "util/Logger/ConfigLines.h"

#include <functional>
#include <list>
#include <string>
#include <utility>

inline namespace korvex {

class LogAppender;

// A piece of the configuration kept for later: a category's definition, or what a parse error
// quotes.
struct DeferedLogConf {
    unsigned lineno;
    std::string context;
};

using DeferedLogConfList = std::list<DeferedLogConf>;

// How one line was understood, for code that explains a configuration instead of applying it.
struct ConfigStatement {
    enum Kind { ROOT, CATEGORY, APPENDER, ATTRIBUTE };
    Kind kind;
    unsigned lineno;
    std::string name;       // the category's or the appender's
    std::string attribute;  // ATTRIBUTE
    std::string value;      // as it is applied
    bool accepted;          // false: it is a parse error too
};

using ConfigListener = std::function<void(const ConfigStatement&)>;

// Reads a logging configuration line by line. Lines of appenders are applied at once. Root and
// categories are applied at the end, because a new channel copies the final state of the root, and
// may name appenders that are defined further down.
class ConfigReader {
  public:
    // Reads from `file`, which it does not own; korvexHome replaces "${KORVEX_HOME}".
    ConfigReader(std::FILE* file, const Pathname& korvexHome);

    // The listener is called for the value of the root, for each appender that a line names and for
    // each attribute when they are read, and for categories when they are applied.
    void setListener(ConfigListener listener) { _listener = std::move(listener); }

    void readAll();
    void applyRoot();
    void applyCategories();

    const DeferedLogConfList& parse_errors() const { return _parseErrors; }
    unsigned xml_comment_startline() const { return _lines.xml_comment_startline(); }

  private:
    void readLine(const std::string& line);
    void readRootCategory(const std::string& line, std::size_t key, std::size_t afterKey);
    void readAppender(const std::string& line, std::size_t name);
    void readAttribute(const std::string& line, std::size_t name, const std::string& appender,
                       LogAppender& la);
    bool applyCategory(const DeferedLogConf& category);
    void addParseError(const std::string& line, std::size_t from);

    ConfigLines _lines;
    const Pathname& _korvexHome;
    ConfigListener _listener;
    DeferedLogConf root_cnf{0, {}};
    DeferedLogConfList cat_cnf;
    DeferedLogConfList _parseErrors;
};

}  // namespace korvex
