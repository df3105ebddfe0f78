#pragma once

#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <functional>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"
#include "tools/ExecTool.h"

namespace testsupport {

using namespace std::string_literals;

inline std::string recordBytes(const std::string& key, const std::string& value) {
    std::string bytes;
    for (const std::string* field : {&key, &value}) {
        for (unsigned i = 0; i < 4; ++i)
            bytes += static_cast<char>(field->size() >> (8 * i) & 0xFF);
        bytes += *field;
    }
    return bytes;
}

// The bytes of a whole record file with these records.
inline std::string fileOf(const std::vector<std::pair<std::string, std::string>>& records) {
    std::string bytes = recordBytes("_record-file-version", "2.0");
    for (const auto& [key, value] : records)
        bytes += recordBytes(key, value);
    return bytes;
}

// A home and a database directory with an empty hashDb, and the tool run in them as the process
// that it is.
class RecordsToolTest : public testing::Test {
  protected:
    RecordsToolTest() {
        std::filesystem::create_directories(dir.file("home/etc"));
        std::filesystem::create_directories(dir.file("db/hashDb"));
        writeFile(dir.file("home/etc/log-cmdline.cfg"), "log4cpp.rootCategory=INFO\n");
    }

    // `prepare` runs in the child right before the tool takes over.
    ChildResult run(
        const std::vector<std::string>& arguments, const std::string& input = "",
        const std::function<void()>& prepare = [] {}) const {
        writeFile(dir.file("input"), input);
        return runInChild([&] {
            dup2(open(dir.file("input").c_str(), O_RDONLY), 0);
            prepare();
            return execTool(arguments);
        });
    }
    // In a child: becomes the tool.
    int execTool(const std::vector<std::string>& arguments) const {
        setenv("KORVEX_HOME", dir.file("home").c_str(), 1);
        setenv("KORVEX_DB", dir.file("db").c_str(), 1);
        testsupport::execTool(arguments);
        return 127;
    }
    std::string stored() const { return readFile(data); }
    std::vector<std::string> beside() const {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(dir.file("db/hashDb"))) {
            names.push_back(entry.path().filename().string());
        }
        std::sort(names.begin(), names.end());
        return names;
    }

    const TempDir dir;
    const std::string data = dir.file("db/hashDb/data");
};

}  // namespace testsupport
