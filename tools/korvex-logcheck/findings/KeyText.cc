#include "findings/KeyText.h"

#include <algorithm>
#include <string_view>
#include <utility>

#include "Text.h"
#include "findings/AttributeNames.h"

namespace {

constexpr std::string_view kPrefix = "log4cpp.";

// Reads a key from left to right and writes down the one that is meant.
class KeyReader {
  public:
    explicit KeyReader(const std::string& line) : _line(line) {}

    std::optional<MendedKey> read() {
        _pos = std::min(_line.find_first_not_of(" \t"), _line.size());
        const std::size_t from = _pos;
        readPrefix();
        if (!readWord()) return {};
        const std::size_t to = _pos;
        _pos = std::min(_line.find_first_not_of(" \t", _pos), _line.size());
        std::size_t colon = std::string::npos;
        if (at(':')) {
            colon = _pos;
            note(Code::KEY_COLON);
        } else if (!at('=')) {
            return {};
        }
        if (!_slip) return {};
        return MendedKey{*_slip, _key, from, to, colon};
    }

  private:
    bool at(char c) const { return _pos < _line.size() && _line[_pos] == c; }

    void note(Code slip) {
        if (!_slip) _slip = slip;
    }

    std::string upTo(std::string_view delimiters) {
        const std::size_t from = _pos;
        _pos = std::min(_line.find_first_of(delimiters, _pos), _line.size());
        return _line.substr(from, _pos - from);
    }

    // The length of a prefix and its sign, of whatever library.
    std::size_t prefixLength() const {
        const std::string low = lowered(std::string_view(_line).substr(_pos, 16));
        for (const std::string_view name : {"log4cpp", "log4cplus", "log4cxx", "log4perl",
                                            "log4net", "log4j2", "log4j", "log4c"}) {
            if (!beginsWith(low, name)) continue;
            const std::string_view sign = std::string_view(low).substr(name.size(), 2);
            if (sign == "::") return name.size() + 2;
            if (beginsWith(sign, ".") || beginsWith(sign, ":")) return name.size() + 1;
        }
        return 0;
    }

    void readPrefix() {
        const std::size_t from = _pos;
        while (const std::size_t length = prefixLength())
            _pos += length;
        if (_pos == from) return;
        if (_line.substr(from, _pos - from) != kPrefix) note(Code::KEY_PREFIX);
        _key = kPrefix;
    }

    bool readWord() {
        const std::string word = upTo(".=: \t");
        const std::string low = lowered(word);
        static constexpr std::pair<std::string_view, std::string_view> kWords[] = {
            {"rootcategory", "rootCategory"}, {"rootlogger", "rootCategory"},
            {"root", "rootCategory"},         {"category", "category"},
            {"logger", "category"},           {"appender", "appender"},
        };
        for (const auto& [name, meant] : kWords) {
            if (low != name) continue;
            if (word != meant) {
                note(low == lowered(meant) ? Code::KEY_CASE : Code::KEY_OTHER_NAME);
            }
            _key += meant;
            _logger = name == "logger";
            if (meant == "rootCategory") return name != "rootlogger" || !at('.') || skipLevel();
            return readName(meant == "appender");
        }
        return false;
    }

    // "rootLogger.level": what else a later version of another library says there is nothing here.
    bool skipLevel() {
        ++_pos;
        return lowered(upTo("=: \t")) == "level";
    }

    bool readName(bool appender) {
        if (!at('.')) return false;
        ++_pos;
        _key += '.';
        if (!appender) {
            // A category's name ends at the "=" only; where there is none, at the colon.
            const bool equals = _line.find('=', _pos) != _line.npos;
            std::string name = upTo(equals ? "=" : ":");
            while (!name.empty() && (name.back() == ' ' || name.back() == '\t')) {
                name.pop_back();
                --_pos;
            }
            if (_logger && endsWith(lowered(name), ".level")) {
                name.resize(name.size() - std::string_view(".level").size());
            } else if (_logger && saysMoreThanItsName(lowered(name))) {
                return false;
            }
            _key += name;
            return true;
        }
        const std::string name = upTo(".=: \t");
        _key += name;
        return !name.empty() && (!at('.') || readAttribute());
    }

    // "net.additivity", which is no logger's name.
    static bool saysMoreThanItsName(const std::string& name) {
        return endsWith(name, ".name") || endsWith(name, ".additivity") ||
               name.find(".appenderref") != name.npos;
    }

    bool readAttribute() {
        ++_pos;
        const std::string attribute = upTo("=: \t");
        const MeantAttribute meant = meantAttribute(attribute);
        if (meant.name != attribute) note(meant.slip);
        _key += '.' + meant.name;
        return !attribute.empty();
    }

    const std::string& _line;
    std::size_t _pos = 0;
    std::string _key;
    bool _logger = false;
    std::optional<Code> _slip;
};

}  // namespace

std::optional<MendedKey> mendedKey(const std::string& content) {
    return KeyReader(content).read();
}
