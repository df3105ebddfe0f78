// Single functions, by Google Benchmark.
#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Pathname.h>
#include <korvex/util/ThreadObj.h>
#include <korvex/util/Timeval.h>

#include <benchmark/benchmark.h>

namespace {

Logger logger("functions");

void filteredDebug(benchmark::State& state) {
    unsigned n = 0;
    for (auto _ : state)
        logger.debug("request %u from %s answered", ++n, "10.0.0.7");
}
BENCHMARK(filteredDebug);

void formatMessage(benchmark::State& state) {
    std::string out;
    for (auto _ : state)
        Logger::format(out, "request %u from %s answered", 7u, "10.0.0.7");
}
BENCHMARK(formatMessage);

void applyLayout(benchmark::State& state, const char* pattern) {
    const LogFormat layout(pattern);
    const LogMsgMetadata metadata(&logger, INFO);
    std::string out;
    for (auto _ : state) {
        out.clear();
        layout.apply(out, metadata, "request 7 from 10.0.0.7 answered");
        benchmark::DoNotOptimize(out.data());
    }
}
BENCHMARK_CAPTURE(applyLayout, message, "%m%n");
BENCHMARK_CAPTURE(applyLayout, relative, "%r %u %m%n");
BENCHMARK_CAPTURE(applyLayout, dated, "%d{ISO8601} [%t] %-5p %c: %m%n");
BENCHMARK_CAPTURE(applyLayout, absolute, "%d{ABSOLUTE} %m%n");

void takeAndReleaseMutex(benchmark::State& state) {
    Mutex mutex;
    for (auto _ : state)
        const ScopedMutex lock(mutex);
}
BENCHMARK(takeAndReleaseMutex);

void joinPath(benchmark::State& state) {
    const Pathname base("/opt/product/var");
    for (auto _ : state)
        benchmark::DoNotOptimize(base / "log/main.log");
}
BENCHMARK(joinPath);

void shellQuoted(benchmark::State& state) {
    const Pathname path("/opt/product/a file with 'quotes'");
    for (auto _ : state)
        benchmark::DoNotOptimize(path.shellQuoted());
}
BENCHMARK(shellQuoted);

void currentTime(benchmark::State& state) {
    for (auto _ : state)
        benchmark::DoNotOptimize(CurrentTimeval());
}
BENCHMARK(currentTime);

void getRecord(benchmark::State& state) {
    RecordFileManager& store = *RecordFileManager::instance();
    char bytes[100] = {};
    store.put("key", {bytes, sizeof bytes}, false);
    for (auto _ : state) {
        PersistentHashData found;
        store.get("key", found);
        delete[] static_cast<char*>(found._pData);
    }
}
BENCHMARK(getRecord);

}  // namespace

int main(int argc, char** argv) {
    Logger::initialize();
    benchmark::Initialize(&argc, argv);
    benchmark::RunSpecifiedBenchmarks();
}
