#include "util/Logger/AppenderRegistry.h"

#include "base/NeverDestroyed.h"
#include "util/Logger/RootObjects.h"

inline namespace korvex {

LogAppenderMap& appenders() {
    static NeverDestroyed<LogAppenderMap> map;
    return *map;
}

LogAppender* LogAppender::find(const std::string& name, bool create) {
    if (name == "rootAppender") return &rootAppender();
    const auto found = appenders().find(name);
    if (found != appenders().end()) return found->second.get();
    if (!create) return nullptr;
    auto made = std::make_unique<LogAppender>();
    made->_registered = true;
    return appenders().emplace(name, std::move(made)).first->second.get();
}

}  // namespace korvex
