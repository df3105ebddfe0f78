#include "util/Logger/ConfigReader.h"

#include <korvex/util/Logger.h>

#include "util/Logger/RootObjects.h"

#include <cstring>
#include <string_view>

inline namespace korvex {

namespace {

constexpr const char* kBlanks = " \t";
constexpr std::string_view kPrefix = "log4cpp.";

// The first position from `from` on that holds one of the delimiters; the line's size when none.
std::size_t findDelimiter(const std::string& line, std::size_t from, const char* delimiters) {
    return from + std::strcspn(line.c_str() + from, delimiters);
}

std::size_t skipBlanks(const std::string& line, std::size_t from) {
    return from + std::strspn(line.c_str() + from, kBlanks);
}

bool isAt(const std::string& line, std::size_t pos, char c) {
    return pos < line.size() && line[pos] == c;
}

}  // namespace

ConfigReader::ConfigReader(std::FILE* file, const Pathname& korvexHome)
    : _lines(file), _korvexHome(korvexHome) {}

void ConfigReader::readAll() {
    std::string line;
    while (_lines.next(line))
        readLine(line);
}

void ConfigReader::readLine(const std::string& line) {
    std::size_t key = skipBlanks(line, 0);
    if (line.compare(key, kPrefix.size(), kPrefix) == 0) key += kPrefix.size();
    if (key == line.size()) return;
    const std::size_t keyEnd = findDelimiter(line, key, ".= \t");
    const std::string_view word = std::string_view(line).substr(key, keyEnd - key);
    if (word == "rootCategory" && keyEnd < line.size()) {
        readRootCategory(line, key, keyEnd);
    } else if (word == "category" && isAt(line, keyEnd, '.')) {
        cat_cnf.push_back({_lines.lineno(), line.substr(keyEnd + 1)});
    } else if (word == "appender" && isAt(line, keyEnd, '.')) {
        readAppender(line, keyEnd + 1);
    } else {
        addParseError(line, key);
    }
}

// The last line of its kind wins.
void ConfigReader::readRootCategory(const std::string& line, std::size_t key,
                                    std::size_t afterKey) {
    const std::size_t equals = skipBlanks(line, afterKey);
    if (isAt(line, equals, '=')) {
        root_cnf = {_lines.lineno(), line.substr(equals + 1)};
        if (_listener) {
            _listener({ConfigStatement::ROOT, _lines.lineno(), "", "", root_cnf.context, true});
        }
    } else {
        addParseError(line, key);
    }
}

// The appender is created as soon as its name is known, even if the rest of the line is invalid.
void ConfigReader::readAppender(const std::string& line, std::size_t name) {
    if (isAt(line, name, ' ') || isAt(line, name, '\t') || isAt(line, name, '=')) {
        addParseError(line, 0);
        return;
    }
    const std::size_t nameEnd = findDelimiter(line, name, ".= \t");
    if (nameEnd == line.size()) {
        addParseError(line, name);
        return;
    }
    const std::string appender = line.substr(name, nameEnd - name);
    LogAppender& la = *LogAppender::find(appender, true);
    if (_listener) {
        _listener({ConfigStatement::APPENDER, _lines.lineno(), appender, "", "", true});
    }
    if (line[nameEnd] == '.') {
        readAttribute(line, nameEnd + 1, appender, la);
    } else if (!isAt(line, skipBlanks(line, nameEnd), '=')) {
        addParseError(line, name);
    }
}

void ConfigReader::readAttribute(const std::string& line, std::size_t name,
                                 const std::string& appender, LogAppender& la) {
    const std::size_t nameEnd = findDelimiter(line, name, "= \t");
    if (nameEnd == line.size()) {
        addParseError(line, name);
        return;
    }
    const std::size_t equals = skipBlanks(line, nameEnd);
    if (!isAt(line, equals, '=')) {
        addParseError(line, 0);
        return;
    }
    const std::string aname = line.substr(name, nameEnd - name);
    const std::string attribute_val = line.substr(skipBlanks(line, equals + 1));
    const bool ok = la.setAttribute(aname, attribute_val.c_str(), _korvexHome);
    if (!ok) addParseError(line, 0);
    if (_listener) {
        _listener(
            {ConfigStatement::ATTRIBUTE, _lines.lineno(), appender, aname, attribute_val, ok});
    }
}

void ConfigReader::addParseError(const std::string& line, std::size_t from) {
    _parseErrors.push_back({_lines.lineno(), line.substr(from)});
}

void ConfigReader::applyRoot() {
    if (!rootChannel().setConfig(root_cnf.context.c_str())) _parseErrors.push_back(root_cnf);
}

// Applies "name=value", the text after "category.". False if it is invalid.
bool ConfigReader::applyCategory(const DeferedLogConf& category) {
    const std::string& cstr = category.context;
    const std::size_t equals = cstr.find('=');
    if (equals == cstr.npos) return false;
    const std::size_t last = equals == 0 ? cstr.npos : cstr.find_last_not_of(kBlanks, equals - 1);
    const std::string lname = cstr.substr(0, last == cstr.npos ? 0 : last + 1);
    const char* const value = cstr.c_str() + equals + 1;
    const bool ok = LogChannel::find(lname, true)->setConfig(value);
    if (_listener) {
        _listener({ConfigStatement::CATEGORY, category.lineno, lname, "", value, ok});
    }
    return ok;
}

void ConfigReader::applyCategories() {
    while (!cat_cnf.empty()) {
        if (applyCategory(cat_cnf.front())) {
            cat_cnf.pop_front();
        } else {
            _parseErrors.splice(_parseErrors.end(), cat_cnf, cat_cnf.begin());
        }
    }
}

}  // namespace korvex
