#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <sys/resource.h>
#include <sys/stat.h>

#include <csignal>
#include <cstdio>
#include <exception>
#include <stdexcept>
#include <string>

#include "Counters.h"
#include "Daemon.h"
#include "Levels.h"
#include "PidFile.h"
#include "Receiver.h"
#include "Saver.h"
#include "Stop.h"

// tallyd counts the names that come to its UDP port, one a datagram, and keeps the counts. It ends
// on SIGTERM and SIGINT; SIGHUP saves at once; SIGUSR1 sets levels of
// logging. See README.md.
namespace {

enum Status { ENDED = 0, FAILED = 1, USAGE = 2 };

Logger logger("tallyd");

std::string complaintAbout(const LoaderInfo& info) {
    const int code = info.validate();
    if (code != 0) return LoaderInfo::getErrorMessage(code);
    if (info.getPort() < 1 || info.getPort() > 65535) return "The port must be 1 to 65535.";
    const std::string mode = info.getStartupMode();
    if (!mode.empty() && mode != "fresh") return "The mode must be \"fresh\", or not given.";
    return "";
}

// The signals that the main thread waits for. Blocked before there are other threads, they are
// blocked in those as well.
sigset_t blockSignals() {
    sigset_t signals;
    sigemptyset(&signals);
    for (const int signal : {SIGTERM, SIGINT, SIGHUP, SIGUSR1})
        sigaddset(&signals, signal);
    pthread_sigmask(SIG_BLOCK, &signals, nullptr);
    return signals;
}

int nextOf(const sigset_t& signals) {
    int signal = 0;
    sigwait(&signals, &signal);
    return signal;
}

void run(const LoaderInfo& info, Daemon& daemon) {
    const Thread mainThread;  // before any other thread
    const sigset_t signals = blockSignals();
    const PidFile pidFile(info.getKorvexDb() / "tallyd.pid");

    Counters counters(info.getKorvexDb() / "hashDb");
    counters.load(info.getStartupMode() == "fresh");
    Stop stop;
    Receiver receiver(openPort(info.getHost(), info.getPort()), counters, stop);
    Saver saver(counters, stop);

    // Every worker is built; only now may they begin.
    receiver.go();
    saver.go();
    logger.info("%s started", info.getComponentName().c_str());
    daemon.ready();

    const Levels levels(info.getKorvexDb() / "tallyd.levels");
    int signal;
    while ((signal = nextOf(signals)) == SIGHUP || signal == SIGUSR1) {
        if (signal == SIGHUP) counters.save();
        if (signal == SIGUSR1) levels.apply();
    }
    logger.info("ending by signal %d", signal);
    stop.now();
    receiver.join();
    saver.join();
    if (!counters.save()) throw std::runtime_error("ended without the last counts");
    logger.info("ended");
}

}  // namespace

int main(int argc, char** argv) {
    LoaderInfo& info = *LoaderInfo::getInstance();
    info.init(argc, argv);
    info.populateFromEnvironment();
    info.populateFromCommandLine();
    if (info.isError()) {
        info.printHelp();
        return USAGE;
    }
    const std::string complaint = complaintAbout(info);
    if (!complaint.empty()) {
        std::fprintf(stderr, "tallyd: %s\n", complaint.c_str());
        return USAGE;
    }
    umask(066);  // as the record store leaves it after a save; so all files are made alike
    const struct rlimit noCore {};
    if (info.getDebug()) setrlimit(RLIMIT_CORE, &noCore);  // --noseg

    Daemon daemon;  // outlives the complaint below, for which the starter waits
    try {
        if (info.getDaemon()) daemon.begin();  // forks, so it comes before threads
        const Pathname directory = info.getInstallConfigPath();
        const char* const file = info.getUseDebugLog() ? "log-debug.cfg" : "log.cfg";
        if (!Logger::initialize(directory / file, info.getKorvexHome())) return FAILED;
        run(info, daemon);
    } catch (const std::exception& e) {
        logger.fatal(e);
        std::fprintf(stderr, "tallyd: %s\n", e.what());  // for whoever started it
        return FAILED;
    }
    return ENDED;
}
