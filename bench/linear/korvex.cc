// What must take time in proportion to its input's length n: prints the nanoseconds of one run for
// each of n of four decades. The driver looks at the slope.
#include "../support/Measure.h"

#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Pathname.h>

namespace {

template <class Work>
double best(Work work) {
    double least = 1e18;
    for (int i = 0; i < 5; ++i)
        least = std::min(least, bench::perCall(1, work));
    return least;
}

std::string repeated(const char* element, unsigned n) {
    std::string text;
    for (unsigned i = 0; i < n; ++i)
        text += element;
    return text;
}

double separators(unsigned n) {
    const Pathname path(repeated("/", n));
    return best([&](unsigned) { Pathname::removeDoubleSeps(path); });
}

double dotDots(unsigned n) {
    const Pathname path(repeated("../", n));
    return best([&](unsigned) { Pathname(path).removeDotDotSlash(); });
}

double quotes(unsigned n) {
    const Pathname path(repeated("'", n));
    return best([&](unsigned) { path.shellQuoted(); });
}

void configure(const std::string& text) {
    std::FILE* const file = std::fopen("linear.cfg", "w");
    std::fputs(text.c_str(), file);
    std::fclose(file);
}

double logLine(unsigned n) {
    configure("rootCategory=INFO, A\nappender.A.fileName=/dev/null\n");
    return bench::inChild([n] {
        Logger::initialize("linear.cfg", "");
        Logger logger("linear");
        const std::string text(n, 'x');
        return best([&](unsigned) { logger.info("%s", text.c_str()); });
    });
}

double configurationLine(unsigned n) {
    configure("rootCategory=" + repeated("INFO,", n / 5) + "\n");
    return bench::inChild(
        [] { return bench::perCall(1, [](unsigned) { Logger::initialize("linear.cfg", ""); }); });
}

double loadRecords(unsigned n) {
    RecordFileManager& store = *RecordFileManager::instance();
    store.setDBFile("linear.data");
    bench::inChild([n, &store] {
        char bytes[100] = {};
        for (unsigned i = 0; i < n; ++i)
            store.put(std::to_string(1000000 + i), {bytes, sizeof bytes}, false);
        store.saveToFile();
        return 0.0;
    });
    return bench::inChild(
        [&store] { return bench::perCall(1, [&store](unsigned) { store.readFile(); }); });
}

}  // namespace

int main(int argc, char** argv) {
    const std::string row = argc > 1 ? argv[1] : "";
    const auto work = row == "separators" ? separators
                      : row == "dotdots"  ? dotDots
                      : row == "quotes"   ? quotes
                      : row == "logline"  ? logLine
                      : row == "confline" ? configurationLine
                                          : loadRecords;
    for (unsigned n = 1000; n <= 1000000; n *= 10)
        bench::report(std::to_string(n).c_str(), work(n));
}
