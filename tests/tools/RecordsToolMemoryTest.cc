#include <korvex/framework/service/RecordFileManager.h>

#include <sys/resource.h>
#include <sys/wait.h>

#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr bool kCounts = false;
#else
constexpr bool kCounts = true;
#endif

class MemoryTest : public RecordsToolTest {
  protected:
    void SetUp() override {
        if (!kCounts || isEmulated()) GTEST_SKIP() << "memory is not what the program asks for";
    }
    // The most memory that a child had, in bytes.
    static long peakOf(const std::function<int()>& body) {
        const pid_t pid = fork();
        if (pid == 0) _exit(body());
        int status = -1;
        struct rusage usage {};
        wait4(pid, &status, 0, &usage);
        EXPECT_EQ(status, 0);
        return usage.ru_maxrss * 1024;
    }
    long peakOfTool(const std::vector<std::string>& arguments) const {
        return peakOf([&] {
            dup2(open("/dev/null", O_RDWR), 1);
            return execTool(arguments);
        });
    }
};

TEST_F(MemoryTest, ManyRecordsTakeAtMostOneAndAHalfTimesTheStoresMemory) {
    std::string records = fileOf({});
    std::string dump = "VERSION=3\nformat=print\nHEADER=END\n";
    std::string json;
    for (int i = 1000000; i < 1250000; ++i) {  // short values: a record's own cost shows
        const std::string key = "key/" + std::to_string(i);
        records += recordBytes(key, "value");
        dump += " " + key + "\n value\n";
        json += "{\"key\":\"" + key + "\",\"value\":\"value\"}\n";
    }
    writeFile(dir.file("json"), json);
    writeFile(data, records);
    writeFile(dir.file("dump"), dump + "DATA=END\n");
    const long nothing = peakOf([] { return 0; });
    const long nothingOfTool = peakOfTool({"--version"});
    records = std::string();
    dump = std::string();
    json = std::string();
    const long store = peakOf([this] {
        RecordFileManager::instance()->setDBFile(Pathname(data));
        RecordFileManager::instance()->readFile();
        return 0;
    });
    ASSERT_GT(store, nothing);
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"put", "x", "1"},
                                               {"load", dir.file("dump")},
                                               {"load", "--replace", dir.file("dump")},
                                               {"-f", dir.file("new"), "load", dir.file("dump")},
                                               {"remove", "key/1000000"},
                                               {"list"},
                                               {"dump"},
                                               {"dump", "--json"},
                                               {"load", "--json", dir.file("json")},
                                               {"salvage", "-o", dir.file("salvaged")},
                                               {"diff", data},
                                               {"stats"},
                                               {"check"}}) {
        const long files = arguments[0] == "diff" ? 2 : 1;
        EXPECT_LT(peakOfTool(arguments) - nothingOfTool, files * (store - nothing) * 3 / 2)
            << testing::PrintToString(arguments);
    }
}

TEST_F(MemoryTest, OneRecordIsReadInTheMemoryOfOneRecord) {
    std::string records = fileOf({});
    for (int i = 100; i < 164; ++i)
        records += recordBytes("key" + std::to_string(i), std::string(1 << 20, 'v'));
    writeFile(data, records);
    const auto limited = [] {
        const struct rlimit limit = {80 << 20, 80 << 20};  // libraries take most of it
        setrlimit(RLIMIT_AS, &limit);
    };
    for (const std::vector<std::string>& arguments :
         std::vector<std::vector<std::string>>{{"get", "key163"},
                                               {"get", "-x", "key100"},
                                               {"list", "-l"},
                                               {"dump"},
                                               {"dump", "--json"},
                                               {"diff", data},
                                               {"stats"},
                                               {"check"},
                                               {"salvage"}}) {
        const ChildResult result = run(arguments, "", limited);
        EXPECT_EQ(result.status, 0) << arguments[0] << result.err;
    }
    EXPECT_EQ(run({"put", "x", "1"}, "", limited).status, 4) << "the limit is one";
    const ChildResult endless = run({"put", "-i", "/dev/zero", "x"}, "", limited);
    EXPECT_EQ(endless.err, "korvex-records: out of memory\n");
    EXPECT_EQ(endless.status, 4);
    EXPECT_EQ(stored().size(), records.size());
}

}  // namespace
