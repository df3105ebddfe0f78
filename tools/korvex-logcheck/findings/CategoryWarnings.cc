#include <algorithm>
#include <map>
#include <set>

#include "Text.h"
#include "findings/Findings.h"
#include "findings/Levels.h"

namespace {

// The words of one value that applies to a channel.
void checkWords(const Reading& reading, const std::string& who, const ConfigStatement& said,
                Findings& to) {
    const std::vector<std::string> words = wordsOf(said.value);
    const Place place = placeOf(reading.source, said);
    if (words.empty()) {
        return tell(to, Code::CATEGORY_EMPTY, place,
                    who + " is given no level and no appender: the line says nothing");
    }
    if (std::count_if(words.begin(), words.end(), isLevel) > 1) {
        tell(to, Code::CATEGORY_LEVELS, place, who + " names several levels; the last one counts");
    }
    std::set<std::string> seen;
    for (const std::string& word : words) {
        if (isLevel(word) || !reading.config.hasAppender(word) || seen.insert(word).second)
            continue;
        tell(to, Code::CATEGORY_TWICE, place,
             who + " names " + quoted(word) + " twice and writes each line twice there");
    }
}

void checkRoot(const Reading& reading, Findings& to) {
    const std::vector<ConfigStatement>& lines = reading.config.root.statements;
    if (lines.empty()) return;
    for (auto line = lines.begin(); line + 1 != lines.end(); ++line) {
        tell(to, Code::CATEGORY_REPLACED, placeOf(reading.source, *line),
             "the root category of this line is replaced by line " +
                 std::to_string(lines.back().lineno));
    }
    checkWords(reading, "the root category", lines.back(), to);
}

std::string withoutWildcard(const std::string& name) {
    constexpr std::string_view signs = "*?.";
    const std::size_t last = name.find_last_not_of(signs);
    if (last == name.npos) return "rootCategory";
    const std::size_t first = name.find_first_not_of(signs);
    return name.substr(first, last - first + 1);
}

bool hasWildcard(const std::string& name) {
    if (name.empty()) return false;
    return name.find_first_of("*?") != name.npos || name.front() == '.' || name.back() == '.';
}

// What it says of the category where others have attributes, as ".level"; empty: nothing.
std::string_view attributeOf(std::string_view name) {
    for (const std::string_view one : {".level", ".priority", ".appender", ".appenders"}) {
        if (name.size() > one.size() && endsWith(name, one)) return one;
    }
    return "";
}

void checkName(const Channel& category, const Place& place, Findings& to) {
    const std::string& name = category.name;
    const std::string who = "category " + quoted(name);
    const std::string low = lowered(name);
    if (isLevel(name) || !levelInOtherCase(name).empty()) {
        tell(to, Code::CATEGORY_LEVEL_NAME, place,
             who + " is spelt like a level; the root's level is set by rootCategory");
    }
    if (name.empty() || name.find_first_of(" \t,\"'") != name.npos) {
        tell(to, Code::CATEGORY_BLANK, place,
             who +
                 (name.empty() ? " has an empty name"
                               : " has a blank, a comma or a quotation mark in its name") +
                 ", as no logger is called",
             std::string(withoutQuotes(name) == name ? "" : withoutQuotes(name)));
    }
    if (low == "root" || low == "rootcategory" || low == "rootlogger") {
        tell(to, Code::CATEGORY_ROOT, place,
             who + " is one like any other; what all others inherit from is set by rootCategory",
             "rootCategory");
    }
    if (hasWildcard(name)) {
        tell(to, Code::CATEGORY_WILDCARD, place,
             who + " is a logger of just that name: there are no wildcards, and names are flat",
             withoutWildcard(name));
    }
    if (const std::string_view attribute = attributeOf(low); !attribute.empty()) {
        tell(to, Code::CATEGORY_ATTRIBUTE, place,
             who +
                 " is a logger of just that name: a category has no attributes, its value gives "
                 "its level and its appenders",
             name.substr(0, name.size() - attribute.size()));
    }
}

// The categories so far, by their names in lower case.
using Seen = std::map<std::string, const Channel*>;

// Of two categories that differ in case only, one is a slip.
void checkCase(Seen& seen, const Channel& category, const Place& place, Findings& to) {
    const auto [other, first] = seen.emplace(lowered(category.name), &category);
    if (first) return;
    const std::string& name = other->second->name;
    tell(to, Code::CATEGORY_CASE, place,
         "category " + quoted(category.name) + " and category " + quoted(name) + ", line " +
             std::to_string(other->second->statements.front().lineno) +
             ", differ in case only and are two",
         name);
}

}  // namespace

void findInCategories(const Reading& reading, Findings& to) {
    checkRoot(reading, to);
    Seen seen;
    for (const Channel& category : reading.config.categories) {
        const ConfigStatement& first = category.statements.front();
        const Place place = nameOf(reading.source, first).place();
        checkName(category, place, to);
        checkCase(seen, category, place, to);
        for (const ConfigStatement& said : category.statements) {
            checkWords(reading, "category " + quoted(category.name), said, to);
            if (&said == &first) continue;
            tell(to, Code::CATEGORY_REPEATED, placeOf(reading.source, said),
                 "category " + quoted(category.name) + " has been set before, on line " +
                     std::to_string(first.lineno) + "; this line is applied on top");
        }
    }
}
