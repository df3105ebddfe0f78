#include <korvex/framework/service/ComponentException.h>
#include <korvex/util/Logger.h>

inline namespace korvex {

ComponentException::ComponentException(const std::string& message) : std::runtime_error(message) {}

ComponentException::ComponentException(Logger& logger, const std::string& message)
    : std::runtime_error(message) {
    logger.error(message);
}

ComponentException::~ComponentException() = default;

}  // namespace korvex
