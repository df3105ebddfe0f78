#include "text/BatchFormat.h"

#include <algorithm>
#include <string_view>
#include <vector>

#include "file/RecordFrame.h"
#include "text/Escape.h"

namespace {

std::vector<std::string_view> fieldsOf(std::string_view line) {
    std::vector<std::string_view> fields;
    for (std::size_t tab = 0; (tab = line.find('\t')) != line.npos; line.remove_prefix(tab + 1))
        fields.push_back(line.substr(0, tab));
    fields.push_back(line);
    return fields;
}

bool isControl(char c) {
    return static_cast<unsigned char>(c) < ' ' || c == '\x7f';
}

std::string decoded(std::string_view field, std::uint64_t number) {
    if (std::any_of(field.begin(), field.end(), isControl)) {
        failBatch(USAGE, number, "a control character; write it as a backslash and two hex digits");
    }
    std::string out;
    if (!appendUnescaped(out, field)) {
        failBatch(USAGE, number, "a backslash without two hex digits");
    }
    return out;
}

BatchLine parsed(std::string_view line, std::uint64_t number) {
    const std::vector<std::string_view> fields = fieldsOf(line);
    BatchLine result;
    result.number = number;
    result.isPut = fields[0] == "put";
    if (!result.isPut && fields[0] != "remove") {
        failBatch(USAGE, number, "neither \"put\" nor \"remove\" before a tab");
    }
    if (fields.size() != (result.isPut ? 3 : 2)) {
        failBatch(USAGE, number,
                  result.isPut ? "not put, KEY and VALUE, parted by tabs"
                               : "not remove and KEY, parted by a tab");
    }
    result.key = decoded(fields[1], number);
    if (result.isPut) result.value = decoded(fields[2], number);
    if (isRefusedKey(result.key)) {
        failBatch(USAGE, number,
                  "refused key \"" + escaped(result.key) + "\": it would not survive a reload");
    }
    return result;
}

}  // namespace

void failBatch(Status status, std::uint64_t line, const std::string& what) {
    throw Failure(status, "batch, line " + std::to_string(line) + ": " + what);
}

void parseBatch(LineInput& in, const std::function<void(const BatchLine&)>& take) {
    std::string line;
    while (in.next(line)) {
        // The value may go on in what is missing.
        if (!in.wasWhole()) failBatch(USAGE, in.number(), "it is cut: no newline at its end");
        if (!line.empty() && line[0] != '#') take(parsed(line, in.number()));
    }
}
