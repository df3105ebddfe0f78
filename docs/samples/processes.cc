// Four processes append to one log file.
#include <korvex/util/Logger.h>

#include <sys/wait.h>
#include <unistd.h>

#include <cstdlib>

static Logger logger("processes");

int main() {
    Logger::initialize(Pathname("processes.cfg"), Pathname(std::getenv("KORVEX_HOME")));
    for (int child = 1; child <= 4; ++child) {
        if (fork() != 0) continue;
        for (int line = 1; line <= 1000; ++line)
            logger.info("process %d, line %d", child, line);
        return 0;
    }
    while (wait(nullptr) > 0) {
    }
}
