#include "examples/RunningTallyd.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <netinet/in.h>
#include <sys/prctl.h>
#include <sys/socket.h>
#include <sys/wait.h>
#include <unistd.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <stdexcept>
#include <thread>

#include "support/LogFiles.h"
#include "tools/ExecTool.h"

namespace testsupport {

namespace fs = std::filesystem;

namespace {

// A loopback address for each process, by its id of at most 22 bits: tests that run in parallel
// never meet.
std::string ownHost() {
    struct in_addr own {};
    own.s_addr = htonl(0x7f400000U + static_cast<std::uint32_t>(getpid()));
    return inet_ntoa(own);
}

struct sockaddr_in addressOf(const std::string& host, int port) {
    struct sockaddr_in in {};
    in.sin_family = AF_INET;
    in.sin_addr.s_addr = inet_addr(host.c_str());
    in.sin_port = htons(static_cast<std::uint16_t>(port));
    return in;
}

// The first that nobody holds at all addresses, below those that the kernel hands out by itself.
int freePort(const std::string& host) {
    for (int port = 20000; port < 32000; ++port) {
        const int fd = socket(AF_INET, SOCK_DGRAM, 0);
        const struct sockaddr_in in = addressOf(host, port);
        const bool bound = bind(fd, reinterpret_cast<const struct sockaddr*>(&in), sizeof in) == 0;
        close(fd);
        if (bound) return port;
    }
    ADD_FAILURE() << "no port of " << host << " is free";
    return 0;
}

bool isDigit(char c) {
    return c >= '0' && c <= '9';
}

void killChildren() {
    const std::string self = std::to_string(getpid());
    std::ifstream children("/proc/" + self + "/task/" + self + "/children");
    for (pid_t child; children >> child;)
        kill(child, SIGKILL);
}

}  // namespace

TallydTest::TallydTest() : _host(ownHost()), _port(freePort(_host)) {
    fs::copy(KORVEX_SOURCE_DIR "/examples/daemon/home", dir.file("home"),
             fs::copy_options::recursive);
    fs::create_directories(dir.file("home/var/log"));
    fs::create_directories(dir.file("db"));
}

// The daemon becomes a child of this process, which can tell how it ended and leaves none behind.
void TallydTest::SetUp() {
    if (prctl(PR_SET_CHILD_SUBREAPER, 1) != 0) GTEST_SKIP() << "daemons are nobody's children here";
}

TallydTest::~TallydTest() {
    do {
        killChildren();  // again and again: what those started becomes ours
    } while (waitpid(-1, nullptr, 0) > 0);
}

void TallydTest::setEnvironment() const {
    setenv("KORVEX_HOME", dir.file("home").c_str(), 1);
    setenv("KORVEX_DB", dir.file("db").c_str(), 1);
}

ChildResult TallydTest::start(std::vector<std::string> arguments,
                              const std::function<void()>& prepare) {
    arguments.insert(arguments.begin(), {"-h", _host, "-p", std::to_string(_port)});
    return runInChild([&] {
        setEnvironment();
        prepare();
        execProgram(KORVEX_TALLYD, arguments);
        return 127;
    });
}

void TallydTest::startInForeground() {
    const pid_t child = fork();
    if (child == 0) {
        setEnvironment();
        execProgram(KORVEX_TALLYD, {"--nodaemon", "-h", _host, "-p", std::to_string(_port)});
        _exit(127);
    }
    eventually([this] { return pid() != 0; });
    EXPECT_EQ(pid(), child);
}

pid_t TallydTest::pid() const {
    const std::string text = readFile(dir.file("db/tallyd.pid"));
    return text.empty() || text.back() != '\n' ? 0 : std::stoi(text);
}

void TallydTest::signal(int number) const {
    const pid_t daemon = pid();
    if (daemon == 0 || ::kill(daemon, number) != 0) throw std::runtime_error("no daemon runs");
}

int TallydTest::end(int number) const {
    const pid_t daemon = pid();
    signal(number);
    return endOf(daemon);
}

int TallydTest::endOf(pid_t daemon) {
    int status = -1;
    eventually([&] { return waitpid(daemon, &status, WNOHANG) != 0; });
    return status;
}

void TallydTest::send(const std::string& datagram) const {
    const int fd = socket(AF_INET, SOCK_DGRAM, 0);
    const struct sockaddr_in in = addressOf(_host, _port);
    EXPECT_EQ(sendto(fd, datagram.data(), datagram.size(), 0,
                     reinterpret_cast<const struct sockaddr*>(&in), sizeof in),
              static_cast<ssize_t>(datagram.size()));
    close(fd);
}

void TallydTest::eventually(const std::function<bool()>& condition) {
    for (int n = 0; n < 3000; ++n) {
        if (condition()) return;
        std::this_thread::sleep_for(std::chrono::milliseconds(10));
    }
    throw std::runtime_error("what the test waits for never came true");
}

ChildResult TallydTest::records(const std::vector<std::string>& arguments) const {
    return runInChild([&] {
        setEnvironment();
        execTool(arguments);
        return 127;
    });
}

std::string TallydTest::saved(const std::string& name) const {
    return records({"get", "count/" + name}).out;
}

std::vector<std::string> TallydTest::log(const std::string& name) const {
    const std::string time = "0000-00-00 00:00:00,000 ";
    std::vector<std::string> lines = linesOf(dir.file("home/var/log/" + name));
    for (std::string& line : lines) {
        std::string shape = line.substr(0, time.size());
        std::replace_if(shape.begin(), shape.end(), isDigit, '0');
        EXPECT_EQ(shape, time) << line;
        line.erase(0, time.size());
    }
    return lines;
}

}  // namespace testsupport
