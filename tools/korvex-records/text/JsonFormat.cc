#include "text/JsonFormat.h"

#include <optional>

#include "Status.h"
#include "file/KeysSoFar.h"
#include "file/RecordFrame.h"
#include "text/Base64.h"
#include "text/Escape.h"
#include "text/JsonString.h"
#include "text/Utf8.h"

namespace {

constexpr std::string_view kMark = "_base64";

void appendMember(std::string& out, const char* name, std::string_view bytes) {
    out += '"';
    out += name;
    const bool isText = isUtf8(bytes);
    if (!isText) out += kMark;
    out += "\":";
    appendJsonString(out, isText ? bytes : toBase64(bytes));
}

// Reads a line and knows where it is.
class LineParser {
  public:
    LineParser(std::uint64_t number, std::string_view line) : _number(number), _rest(line) {}

    void parse(std::string& key, std::string& value) {
        expect('{');
        do {
            parseMember();
        } while (take(','));
        expect('}');
        skipBlanks();
        if (!_rest.empty()) fail("something behind the object");
        if (!_key || !_value) fail("no key and value");
        key = std::move(*_key);
        value = std::move(*_value);
    }

    [[noreturn]] void fail(const std::string& what) const {
        throw Failure(USAGE, "dump, line " + std::to_string(_number) + ": " + what);
    }

  private:
    void skipBlanks() {
        while (!_rest.empty() && (_rest[0] == ' ' || _rest[0] == '\t' || _rest[0] == '\r'))
            _rest.remove_prefix(1);
    }
    bool take(char c) {
        skipBlanks();
        if (_rest.empty() || _rest[0] != c) return false;
        _rest.remove_prefix(1);
        return true;
    }
    void expect(char c) {
        if (!take(c)) fail(std::string("no ") + c);
    }
    std::string readString() {
        skipBlanks();
        std::string text;
        const char* const wrong = readJsonString(_rest, text);
        if (wrong != nullptr) fail(wrong);
        return text;
    }

    void parseMember() {
        std::string name = readString();
        expect(':');
        std::string bytes = readString();
        if (name == "damaged") fail("the dump is of a damaged file: " + escaped(bytes));
        if (name.size() > kMark.size() &&
            name.compare(name.size() - kMark.size(), kMark.size(), kMark) == 0) {
            name.resize(name.size() - kMark.size());
            std::string decoded;
            if (!appendBase64(decoded, bytes)) fail("no base 64");
            bytes = std::move(decoded);
        }
        if (name != "key" && name != "value") fail("unknown name \"" + escaped(name) + "\"");
        std::optional<std::string>& part = name == "key" ? _key : _value;
        if (part) fail("\"" + name + "\" comes twice");
        part = std::move(bytes);
    }

    const std::uint64_t _number;
    std::string_view _rest;
    std::optional<std::string> _key;
    std::optional<std::string> _value;
};

// The keys of the first so many lines, which are known to be fine; leaves the input behind the
// next.
void parseAgain(LineInput& in, std::uint64_t count, const KeysSoFar::Take& take) {
    std::string line;
    std::string key;
    std::string value;
    in.rewind();
    while (in.next(line) && in.number() <= count) {
        LineParser(in.number(), line).parse(key, value);
        take(key);
    }
}

}  // namespace

void appendJsonLine(std::string& out, std::string_view key, std::string_view value) {
    out += '{';
    appendMember(out, "key", key);
    out += ',';
    appendMember(out, "value", value);
    out += "}\n";
}

std::string jsonDamage(const std::string& damage) {
    std::string line = "{\"damaged\":";
    appendJsonString(line, isUtf8(damage) ? damage : escaped(damage));
    return line + "}\n";
}

void parseJson(LineInput& in, const DumpedRecordTaker& take) {
    KeysSoFar keys;
    const auto again = [&](const KeysSoFar::Take& former) { parseAgain(in, keys.count(), former); };
    std::string line;
    std::string key;
    std::string value;
    while (in.next(line)) {
        LineParser parser(in.number(), line);
        // A dump has no last line that would tell; but where it was cut there is most often this.
        if (!in.wasWhole()) parser.fail("it is cut: no newline at its end");
        parser.parse(key, value);
        if (isRefusedKey(key)) {
            parser.fail("refused key \"" + escaped(key) + "\": it would not survive a reload");
        }
        if (!keys.add(key, again)) parser.fail("key \"" + escaped(key) + "\" comes twice");
        take(key, value);
    }
}
