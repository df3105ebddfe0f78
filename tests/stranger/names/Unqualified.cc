#undef KORVEX_QUALIFIED_NAMES
#include <korvex/util/Logger.h>

void logByName(Logger& logger) {
    logger.info("by name %d", ERROR);
}
