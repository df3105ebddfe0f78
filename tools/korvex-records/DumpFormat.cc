#include "DumpFormat.h"

#include "Escape.h"
#include "Progress.h"
#include "Status.h"

namespace {

// Reads a dump line by line and knows where it is.
class DumpParser {
  public:
    explicit DumpParser(std::istream& in) : _in(in) {}

    Records parse() {
        parseHeader();
        Records records;
        for (std::string line; line = nextLine(), line != "DATA=END";) {
            std::string key = decoded(line);
            line = nextLine();
            if (line == "DATA=END") fail("a key without a value");
            records[std::move(key)] = decoded(line);
        }
        return records;
    }

  private:
    [[noreturn]] void fail(const std::string& what) const {
        throw Failure(USAGE, "dump, line " + std::to_string(_lineno) + ": " + what);
    }

    std::string nextLine() {
        std::string line;
        ++_lineno;
        if (std::getline(_in, line)) {
            progressAt(_bytes += line.size() + 1);
            return line;
        }
        if (_in.bad()) throw Failure(IO_ERROR, withErrno("cannot read the dump"));
        fail("the dump ends without its last line, DATA=END");
    }

    void parseHeader() {
        if (nextLine() != "VERSION=3") fail("no VERSION=3");
        for (std::string line; line = nextLine(), line != "HEADER=END";) {
            if (line == "format=print") {
                _print = true;
            } else if (line.compare(0, 7, "format=") == 0 && line != "format=bytevalue") {
                fail("unknown " + line);
            } else if (line.find('=') == line.npos) {
                fail("no NAME=VALUE");
            }
        }
    }

    std::string decoded(const std::string& line) const {
        if (line.empty() || line[0] != ' ') fail("no blank at the start of a record's line");
        return _print ? decodedText(line) : decodedHex(line);
    }

    std::string decodedHex(const std::string& line) const {
        std::string out;
        if (line.size() % 2 == 0) fail("an odd number of hex digits");
        for (std::size_t i = 1; i < line.size(); i += 2) {
            if (!appendHexByte(out, line[i], line[i + 1])) fail("no hex digits");
        }
        return out;
    }

    std::string decodedText(const std::string& line) const {
        std::string out;
        for (std::size_t i = 1; i < line.size(); ++i) {
            if (line[i] != '\\') {
                out += line[i];
            } else if (i + 1 < line.size() && line[i + 1] == '\\') {
                out += line[++i];
            } else if (i + 2 < line.size() && appendHexByte(out, line[i + 1], line[i + 2])) {
                i += 2;
            } else {
                fail("a backslash without two hex digits");
            }
        }
        return out;
    }

    std::istream& _in;
    unsigned long _lineno = 0;
    std::uint64_t _bytes = 0;
    bool _print = false;
};

}  // namespace

std::string dumpHeader(bool print) {
    return std::string("VERSION=3\nformat=") + (print ? "print" : "bytevalue") +
           "\ntype=btree\nHEADER=END\n";
}

std::string dumpLine(std::string_view bytes, bool print) {
    return " " + (print ? escaped(bytes) : toHex(bytes)) + "\n";
}

std::string dumpTrailer() {
    return "DATA=END\n";
}

Records parseDump(std::istream& in) {
    return DumpParser(in).parse();
}
