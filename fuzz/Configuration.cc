#include <korvex/util/Logger.h>

#include <algorithm>
#include <cstdio>

#include "Check.h"
#include "Input.h"
#include "base/Stream.h"
#include "util/Logger/AppenderRegistry.h"
#include "util/Logger/ChannelRegistry.h"
#include "util/Logger/ConfigReader.h"
#include "util/Logger/LoggingLock.h"

namespace {

// Forgets what the last configuration made; the two layouts that have names stay.
void reset() {
    {
        ChannelRegistry& registry = ChannelRegistry::instance();
        const LoggingLock lock(registry.mutex);
        registry.channels.clear();
    }
    appenders().clear();
    if (layouts().empty()) {
        LogAppender any;
        any.setAttribute("layout", "BasicLayout", Pathname());
        any.setAttribute("layout", "SimpleLayout", Pathname());
    }
    layouts().resize(2);
}

}  // namespace

// A configuration as far as it is read; no file of it is opened. No line is told that is not there.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size == 0) return 0;
    reset();
    const Stream file(fmemopen(const_cast<std::uint8_t*>(data), size, "r"));
    const Pathname home("/opt/home");
    ConfigReader reader(file.get(), home);
    reader.readAll();
    reader.applyRoot();
    reader.applyCategories();
    const auto lines = static_cast<unsigned>(std::count(data, data + size, '\n')) + 1;
    for (const DeferedLogConf& error : reader.parse_errors()) {
        check(error.lineno >= 1 && error.lineno <= lines, "an error's line");
        check(error.context.find('\n') == error.context.npos, "an error's context");
    }
    check(reader.xml_comment_startline() == ConfigLines::kNone ||
              (reader.xml_comment_startline() >= 1 && reader.xml_comment_startline() <= lines),
          "where a comment started");
    for (const auto& [name, appender] : appenders())
        check(LogAppender::find(name, false) == appender.get(), "an appender by its name");
    return 0;
}
