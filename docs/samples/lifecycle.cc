// What a logger does before configuration, after it, and while the process ends.
#include <korvex/util/Logger.h>

#include <cerrno>
#include <cstdlib>
#include <stdexcept>

static Logger logger("life");

static void atExit() {
    logger.info("in an exit handler");
}

static struct Last {
    ~Last() { logger.info("in a static destructor"); }
} last;

int main() {
    std::atexit(&atExit);
    logger.debug("not seen: only INFO and above before configuration");
    logger.info("before configuration");
    Logger::initialize(Pathname("life.cfg"), Pathname(std::getenv("KORVEX_HOME")));
    logger.debug("configured, %d %s", 2, "arguments");
    logger.info(std::string("a string, 100% as it is"));
    logger.error(std::runtime_error("an exception's what()"));
    Logger::setChannelLevel("life", "WARN");
    logger.info("not seen: below WARN now");
    Logger::setChannelLevel("life", "INFO");
    errno = ENOENT;
    __extension__ logger.warn("%%m is the text of errno: %m");
}
