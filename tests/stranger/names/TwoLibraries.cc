// Two logging libraries in one file.
#include <korvex/util/Logger.h>
#include <log4cplus/configurator.h>
#include <log4cplus/initializer.h>
#include <log4cplus/logger.h>
#include <log4cplus/loggingmacros.h>

using namespace log4cplus;

int main() {
    const Initializer initializer;
    BasicConfigurator::doConfigure();
    Logger other = Logger::getInstance(LOG4CPLUS_TEXT("other"));
    korvex::Logger("korvex").info("hello");
#ifdef MISTAKEN
    other.setLogLevel(ERROR);  // a number of Korvex's
#else
    other.setLogLevel(ERROR_LOG_LEVEL);
#endif
    LOG4CPLUS_INFO(other, LOG4CPLUS_TEXT("not to be seen"));
    LOG4CPLUS_ERROR(other, LOG4CPLUS_TEXT("hello"));
}
