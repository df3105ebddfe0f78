#include <korvex/framework/service/RecordFileManager.h>

#include <sys/ptrace.h>
#include <sys/resource.h>
#include <sys/wait.h>

#ifdef __GLIBC__
#include <malloc.h>
#endif

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
    // A number of /proc/PID/status, in KiB.
    static long statusOf(const std::string& pid, const std::string& name) {
        const std::string all = readFile("/proc/" + pid + "/status");
        return std::atol(all.c_str() + all.find("\n" + name + ":") + name.size() + 2);
    }
    // By how much a process grows that loads the record file, in KiB.
    long growthOfStore() const {
        const ChildResult result = runInChild([this] {
#ifdef __GLIBC__
            malloc_trim(0);  // what is free must not serve the store
#endif
            const long before = statusOf("self", "VmRSS");
            RecordFileManager::instance()->setDBFile(Pathname(data));
            RecordFileManager::instance()->readFile();
            std::printf("%ld", statusOf("self", "VmRSS") - before);
            return 0;
        });
        return std::atol(result.out.c_str());
    }
    // The most memory that the tool had, in KiB. Looked at as it ends: what wait4(2) tells begins
    // with the memory of this process.
    long peakOfTool(const std::vector<std::string>& arguments) const {
        const pid_t pid = fork();
        if (pid == 0) {
            ptrace(PTRACE_TRACEME, 0, nullptr, nullptr);
            dup2(open("/dev/null", O_RDWR), 1);
            _exit(execTool(arguments));
        }
        long peak = 0;
        int status = 0;
        for (bool first = true; waitpid(pid, &status, 0) == pid && WIFSTOPPED(status);
             first = false) {
            if (first) ptrace(PTRACE_SETOPTIONS, pid, nullptr, PTRACE_O_TRACEEXIT);
            if (status >> 16 == PTRACE_EVENT_EXIT) peak = statusOf(std::to_string(pid), "VmHWM");
            ptrace(PTRACE_CONT, pid, nullptr, nullptr);
        }
        EXPECT_TRUE(WIFEXITED(status) && WEXITSTATUS(status) == 0) << arguments[0];
        EXPECT_GT(peak, 0);
        return peak;
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
    records = std::string();
    dump = std::string();
    json = std::string();
    const long nothing = peakOfTool({"--version"});
    const long store = growthOfStore();
    ASSERT_GT(store, 5000);
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
        EXPECT_LT(peakOfTool(arguments) - nothing, files * store * 3 / 2)
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
