#pragma once

#include <korvex/Export.h>

#include <stdexcept>
#include <string>

KORVEX_NAMESPACE(korvex) {

class Logger;

// Thrown by a framework component that has become unusable. what() is the message.
class ComponentException : public std::runtime_error {
  public:
    // Logs nothing.
    explicit ComponentException(const std::string& message);
    // Also logs the message at level ERROR, when it is constructed: once, where it is thrown.
    ComponentException(Logger& logger, const std::string& message);
    ComponentException(const ComponentException&) = default;
    ComponentException& operator=(const ComponentException&) = default;
    ~ComponentException() override;
};

}  // KORVEX_NAMESPACE(korvex)
