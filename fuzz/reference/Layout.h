#pragma once

#include <cstdint>
#include <optional>
#include <string>

// The layouts once more, slowly and obviously: the pattern is read anew for each line.
namespace reference {

struct Line {
    std::string message;
    std::string channel;
    std::string level;
    std::string thread;
    std::uint64_t epochMsec;
    int sec;  // the stamp
    int usec;
};

// The date layout `name`, or null for none; nothing where a piece stays empty for no good reason,
// which cannot be laid out.
std::optional<std::string> date(const char* name, std::size_t length, int sec, int usec);

// The line; nothing as above.
std::optional<std::string> layOut(const std::string& pattern, const Line& line);

// Whether the pattern is one to try: no widths that would fill the memory, no "u", which is
// clock().
bool isReasonable(const std::string& pattern);

}  // namespace reference
