// Changes the level while the program runs: SIGUSR1 shows debug messages, SIGUSR2 hides them.
#include <korvex/util/JoiningThread.h>
#include <korvex/util/Logger.h>

#include <unistd.h>

#include <csignal>
#include <cstdlib>

static Logger logger("signals");

static void watch(const sigset_t& watched) {
    for (;;) {
        int signal = 0;
        if (sigwait(&watched, &signal) != 0 || signal == SIGTERM) return;
        Logger::setChannelLevel(nullptr, signal == SIGUSR1 ? "DEBUG" : "INFO");
    }
}

// Stands for `kill -USR1 PID` in a shell.
static void sendAndWait(int signal, bool debug) {
    kill(getpid(), signal);
    while (logger.isDebugEnabled() != debug)
        usleep(1000);
}

int main() {
    sigset_t watched;
    sigemptyset(&watched);
    for (const int signal : {SIGUSR1, SIGUSR2, SIGTERM})
        sigaddset(&watched, signal);
    pthread_sigmask(SIG_BLOCK, &watched, nullptr);  // before the first thread; threads inherit it

    Logger::initialize(Pathname("signals.cfg"), Pathname(std::getenv("KORVEX_HOME")));
    Thread mainThread;
    JoiningThread watcher("signals", [&watched] { watch(watched); });

    logger.debug("not seen");
    sendAndWait(SIGUSR1, true);
    logger.debug("seen after SIGUSR1");
    sendAndWait(SIGUSR2, false);
    logger.debug("not seen");
    logger.info("ending");
    kill(getpid(), SIGTERM);
}
