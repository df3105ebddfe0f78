// Logs eleven lines of eleven bytes each to a file that is rotated beyond 25 bytes.
#include <korvex/util/Logger.h>

#include <cstdlib>

static Logger logger("rotation");

int main() {
    Logger::initialize(Pathname("rotation.cfg"), Pathname(std::getenv("KORVEX_HOME")));
    for (int i = 1; i <= 11; ++i)
        logger.info("message %02d", i);
}
