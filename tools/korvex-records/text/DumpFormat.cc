#include "text/DumpFormat.h"

#include "Status.h"
#include "file/KeysSoFar.h"
#include "file/RecordFrame.h"
#include "text/Escape.h"

namespace {

// Reads a dump line by line and knows where it is.
class DumpParser {
  public:
    DumpParser(LineInput& in, const DumpedRecordTaker& take) : _in(in), _take(take) {}

    void parse() {
        parseHeader();
        for (nextLine(); _line != "DATA=END"; nextLine())
            parseRecord();
        if (!_in.next(_line)) return;
        fail(_line == "VERSION=3" ? "several databases in one dump" : "something behind DATA=END");
    }

  private:
    // The keys of the first so many records, which are known to be fine, and leaves the input
    // behind the next one's.
    void parseAgain(std::uint64_t count) {
        _in.rewind();
        parseHeader();
        for (std::uint64_t i = 0; i < count; ++i) {
            nextLine();
            parseRecord();
        }
        nextLine();
    }

    [[noreturn]] void fail(const std::string& what) const {
        throw Failure(USAGE, "dump, line " + std::to_string(_in.number()) + ": " + what);
    }

    void nextLine() {
        if (!_in.next(_line)) fail("the dump ends without its last line, DATA=END");
    }

    void parseHeader() {
        nextLine();
        if (_line != "VERSION=3") fail("no VERSION=3");
        bool isNumbered = false;  // its keys are the numbers of records, which may be left out
        std::string keys;
        for (nextLine(); _line != "HEADER=END"; nextLine()) {
            const std::size_t equals = _line.find('=');
            if (equals == _line.npos) fail("no NAME=VALUE");
            const std::string name = _line.substr(0, equals);
            const std::string value = _line.substr(equals + 1);
            if (name == "format" && value != "print" && value != "bytevalue") unknown();
            if (name == "format") _print = value == "print";
            if (name == "type") isNumbered = parseType(value);
            if (name == "keys") keys = value;
            if (name == "duplicates") _duplicates = value == "1";
        }
        if (keys.empty() ? isNumbered : keys != "1") fail("a dump without keys");
    }

    [[noreturn]] void unknown() const { fail("unknown " + escaped(_line)); }

    bool parseType(const std::string& type) const {
        if (type == "recno" || type == "queue") return true;
        if (type != "btree" && type != "hash") unknown();
        return false;
    }

    void parseRecord() {
        decode(_key);
        if (isRefusedKey(_key)) {
            fail("refused key \"" + escaped(_key) + "\": it would not survive a reload");
        }
        const auto again = [this](const KeysSoFar::Take& take) {
            DumpParser(_in, [&take](const std::string& key, const std::string&) {
                take(key);
            }).parseAgain(_keys.count());
        };
        if (!_keys.add(_key, again)) {
            fail("key \"" + escaped(_key) + "\" comes twice" +
                 (_duplicates ? ", as duplicates=1 says; a record file holds a key once" : ""));
        }
        nextLine();
        if (_line == "DATA=END") fail("a key without a value");
        decode(_value);
        _take(_key, _value);
    }

    void decode(std::string& out) const {
        if (_line.empty() || _line[0] != ' ') fail("no blank at the start of a record's line");
        out.clear();
        if (!_print) {
            decodeHex(out);
        } else if (!appendUnescaped(out, std::string_view(_line).substr(1))) {
            fail("a backslash without two hex digits");
        }
    }

    void decodeHex(std::string& out) const {
        if (_line.size() % 2 == 0) fail("an odd number of hex digits");
        for (std::size_t i = 1; i < _line.size(); i += 2) {
            if (!appendHexByte(out, _line[i], _line[i + 1])) fail("no hex digits");
        }
    }

    LineInput& _in;
    const DumpedRecordTaker& _take;
    KeysSoFar _keys;
    std::string _line;
    std::string _key;
    std::string _value;
    bool _print = false;
    bool _duplicates = false;
};

}  // namespace

std::string dumpHeader(bool print) {
    return std::string("VERSION=3\nformat=") + (print ? "print" : "bytevalue") +
           "\ntype=btree\nHEADER=END\n";
}

void appendDumpLine(std::string& out, std::string_view bytes, bool print) {
    out += ' ';
    if (print) appendEscaped(out, bytes, "\\5c");
    if (!print) appendHex(out, bytes);
    out += '\n';
}

std::string dumpTrailer() {
    return "DATA=END\n";
}

void parseDump(LineInput& in, const DumpedRecordTaker& take) {
    DumpParser(in, take).parse();
}
