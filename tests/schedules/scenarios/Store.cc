#include "scenarios/Store.h"

#include <korvex/framework/service/RecordFileManager.h>

#include <cstdlib>

#include "explorer/Scenario.h"
#include "scenarios/Logging.h"
#include "scenarios/Parallel.h"

// The record store: puts beside puts, forks and exits in the middle of a save.

namespace schedules {

namespace {

std::string field(const std::string& text) {
    std::string bytes;
    for (unsigned shift = 0; shift < 32; shift += 8)
        bytes += static_cast<char>(text.size() >> shift);
    return bytes + text;
}

// More than any stream's buffer holds, so that saving takes several writes.
std::string largeValue() {
    return std::string(70000, 'v');
}

void useFile() {
    RecordFileManager::instance()->setDBFile(Pathname("data"));
}

void putBesidePut() {
    useFile();
    Parallel{[] { put("a", "1", true); }, [] { put("b", "2", true); }}.join();
}

std::string checkBoth(const Remains& remains) {
    if (!remains.err.empty()) return "standard error holds " + remains.err;
    return remains.file("data") == recordFile({{"a", "1"}, {"b", "2"}})
               ? ""
               : "the file does not hold both records";
}

void putTheSame() {
    useFile();
    Parallel{[] { put("a", "1", false); }, [] { put("a", "2", true); }}.join();
}

std::string checkEither(const Remains& remains) {
    const std::string file = remains.file("data");
    return file == recordFile({{"a", "1"}}) || file == recordFile({{"a", "2"}})
               ? ""
               : "the file holds neither value";
}

// While it holds the store's lock a put logs; a fork takes the locks of both.
void forkBesideLoggingPut() {
    configure("rootCategory=DEBUG,A\nappender.A=File\nappender.A.fileName=log\n");
    useFile();
    Parallel threads{[] { put("a", "1", true); }};
    inForkedChild([] {
        RecordFileManager::instance()->setDBFile(Pathname("child"));
        put("b", "2", true);
    });
    threads.join();
}

std::string checkLoggingPut(const Remains& remains) {
    const std::string line = "Writing record file to disk.";
    if (remains.file("data") != recordFile({{"a", "1"}})) return "the file is damaged";
    return compare("the log", Remains::lines(remains.file("log")), {line, line});
}

// The child has what its parent had put, and a file of its own.
void forkBesidePut() {
    useFile();
    put("a", "1", false);
    Parallel threads{[] { put("b", "2", true); }};
    inForkedChild([] {
        RecordFileManager::instance()->setDBFile(Pathname("child"));
        put("c", "3", true);
    });
    threads.join();
}

std::string checkForked(const Remains& remains) {
    if (remains.file("data") != recordFile({{"a", "1"}, {"b", "2"}})) return "the file is damaged";
    const std::string child = remains.file("child");
    return child == recordFile({{"a", "1"}, {"c", "3"}}) ||
                   child == recordFile({{"a", "1"}, {"b", "2"}, {"c", "3"}})
               ? ""
               : "the child's file is damaged";
}

// The child's exit must not write what is the parent's.
void exitInChildOfPut() {
    useFile();
    put("a", largeValue(), false);
    Parallel threads{[] { put("b", "2", true); }};
    inForkedChild([] { std::exit(0); });
    threads.join();
}

void exitInChildOfSave() {
    useFile();
    put("a", largeValue(), false);
    put("b", "2", false);
    Parallel threads{[] { RecordFileManager::instance()->saveToFile(); }};
    inForkedChild([] { std::exit(0); });
    threads.join();
}

void exitInChildOfRemove() {
    useFile();
    put("a", largeValue(), false);
    put("b", "2", false);
    put("c", "3", false);
    Parallel threads{[] { RecordFileManager::instance()->remove("c"); }};
    inForkedChild([] { std::exit(0); });
    threads.join();
}

std::string checkForkedExit(const Remains& remains) {
    return remains.file("data") == recordFile({{"a", largeValue()}, {"b", "2"}})
               ? ""
               : "the file is damaged";
}

void exitBesidePut() {
    useFile();
    put("a", largeValue(), false);
    Parallel threads{[] { put("b", largeValue(), true); }};
    std::exit(0);
}

void exitBesideSave() {
    useFile();
    put("a", largeValue(), false);
    put("b", largeValue(), false);
    Parallel threads{[] { RecordFileManager::instance()->saveToFile(); }};
    std::exit(0);
}

std::string checkExit(const Remains& remains) {
    return isBeginningOf(remains.file("data"),
                         recordFile({{"a", largeValue()}, {"b", largeValue()}}))
               ? ""
               : "the file is no beginning of what was saved";
}

void exitBesideRemove() {
    useFile();
    put("a", largeValue(), false);
    put("b", "2", false);
    Parallel threads{[] { RecordFileManager::instance()->remove("b"); }};
    std::exit(0);
}

std::string checkRemove(const Remains& remains) {
    return isBeginningOf(remains.file("data"), recordFile({{"a", largeValue()}}))
               ? ""
               : "the file is no beginning of what was saved";
}

const Register registered{
    {"put-beside-put", &putBesidePut, &checkBoth},
    {"put-the-same", &putTheSame, &checkEither},
    {"fork-beside-logging-put", &forkBesideLoggingPut, &checkLoggingPut},
    {"fork-beside-put", &forkBesidePut, &checkForked},
    {"exit-in-child-of-put", &exitInChildOfPut, &checkForkedExit},
    {"exit-in-child-of-remove", &exitInChildOfRemove, &checkForkedExit},
    {"exit-in-child-of-save", &exitInChildOfSave, &checkForkedExit},
    {"exit-beside-put", &exitBesidePut, &checkExit},
    {"exit-beside-save", &exitBesideSave, &checkExit},
    {"exit-beside-remove", &exitBesideRemove, &checkRemove},
};

}  // namespace

void put(const std::string& key, const std::string& value, bool save) {
    PersistentHashData data;
    data._pData = const_cast<char*>(value.data());
    data._size = static_cast<std::uint32_t>(value.size());
    RecordFileManager::instance()->put(key, data, save);
}

std::string recordFile(std::initializer_list<std::pair<std::string, std::string>> records) {
    std::string bytes = field("_record-file-version") + field("2.0");
    for (const auto& [key, value] : records)
        bytes += field(key) + field(value);
    return bytes;
}

bool isBeginningOf(const std::string& bytes, const std::string& whole) {
    return whole.compare(0, bytes.size(), bytes) == 0;
}

}  // namespace schedules
