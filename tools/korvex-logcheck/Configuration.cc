#include "Configuration.h"

#include <algorithm>
#include <cstdio>
#include <new>
#include <utility>

#include "Text.h"
#include "base/Stream.h"
#include "util/Logger/AppenderRegistry.h"
#include "util/Logger/ChannelRegistry.h"
#include "util/Logger/LoggingLock.h"
#include "util/Logger/RootObjects.h"

namespace {

// Forgets what an earlier configuration made. The two layouts that have names stay.
void forget() {
    {
        ChannelRegistry& registry = ChannelRegistry::instance();
        const LoggingLock lock(registry.mutex);
        registry.channels.clear();
    }
    rootChannel().setConfig("INFO rootAppender");
    appenders().clear();
    for (const auto& [attribute, value] :
         {std::pair("fileName", ""), std::pair("maxFileSize", "0"),
          std::pair("maxBackupIndex", "0"), std::pair("layout", "SimpleLayout"),
          std::pair("layout", "BasicLayout")}) {
        rootAppender().setAttribute(attribute, value, Pathname());
    }
    layouts().resize(2);
    rootAppender().setAttribute("layout.ConversionPattern", "%m%n", Pathname());
}

// (Not every system makes a stream of no bytes.)
Stream streamOf(const std::string& text) {
    if (text.empty()) return Stream(std::fopen("/dev/null", "r"));
    return Stream(fmemopen(const_cast<char*>(text.data()), text.size(), "r"));
}

template <class Items>
auto named(Items& items, const std::string& name) -> decltype(&items.front()) {
    const auto found = std::find_if(items.begin(), items.end(),
                                    [&](const auto& item) { return item.name == name; });
    return found == items.end() ? nullptr : &*found;
}

void hearAppender(Configuration& config, const ConfigStatement& said) {
    const LogAppender* const made = LogAppender::find(said.name, false);
    Appender* known =
        made == &rootAppender() ? &config.rootAppender : named(config.appenders, said.name);
    if (known == nullptr) {
        config.appenders.push_back({said.name, said.lineno, made, {}, {}, {}});
        known = &config.appenders.back();
    }
    if (said.kind == ConfigStatement::APPENDER) {
        known->declarations.push_back(said.lineno);
    } else {
        // What was heard of first was only the name in front of the attribute.
        known->declarations.pop_back();
        known->attributes.push_back(said);
    }
}

// Where each category stands; there may be thousands.
using Places = std::map<std::string, std::size_t>;

void hearCategory(Configuration& config, Places& places, const ConfigStatement& said) {
    const auto [place, first] = places.emplace(said.name, config.categories.size());
    if (first) config.categories.push_back({said.name, LogChannel::find(said.name, false), {}});
    config.categories[place->second].statements.push_back(said);
}

void hear(Configuration& config, Places& places, const ConfigStatement& said) {
    if (said.kind == ConfigStatement::ROOT) {
        config.root.statements.push_back(said);
    } else if (said.kind == ConfigStatement::CATEGORY) {
        hearCategory(config, places, said);
    } else {
        hearAppender(config, said);
    }
}

}  // namespace

Configuration Configuration::read(const std::string& text, const Pathname& home) {
    epoch_timeval();
    forget();
    Configuration config;
    config.root.made = &rootChannel();
    config.rootAppender.name = "rootAppender";
    config.rootAppender.made = &::rootAppender();
    const Stream stream = streamOf(text);
    if (!stream) throw std::bad_alloc();
    ConfigReader reader(stream.get(), home);
    Places categories;
    reader.setListener([&](const ConfigStatement& said) { hear(config, categories, said); });
    reader.readAll();
    reader.applyRoot();
    reader.applyCategories();
    for (Appender& appender : config.appenders)
        appender.complaints = LogAppender::find(appender.name, false)->settle();
    for (const DeferedLogConf& error : reader.parse_errors())
        config.parseErrors.emplace(error.lineno, error.context);
    config.openComment = reader.xml_comment_startline();
    return config;
}

bool Configuration::hasAppender(const std::string& name) const {
    return LogAppender::find(name, false) != nullptr;
}

const Appender* Configuration::appenderOf(const LogAppender* made) const {
    for (const Appender& appender : appenders) {
        if (appender.made == made) return &appender;
    }
    return &rootAppender;
}

std::vector<const LogAppender*> Configuration::destinations(const LogChannel& channel) {
    if (channel.appenders().empty()) return {&::rootAppender()};
    return {channel.appenders().begin(), channel.appenders().end()};
}

bool Configuration::writesTo(const LogChannel& channel, const LogAppender& appender) {
    const auto all = destinations(channel);
    return std::count(all.begin(), all.end(), &appender) > 0;
}

std::vector<const Appender*> Configuration::everyAppender() const {
    std::vector<const Appender*> all;
    for (const Appender& appender : appenders)
        all.push_back(&appender);
    all.push_back(&rootAppender);
    return all;
}

std::vector<const ConfigStatement*> Configuration::appliedValues() const {
    std::vector<const ConfigStatement*> all;
    if (!root.statements.empty()) all.push_back(&root.statements.back());
    for (const Channel& category : categories) {
        for (const ConfigStatement& said : category.statements)
            all.push_back(&said);
    }
    return all;
}

std::vector<std::string> Configuration::users(const LogAppender& appender) const {
    std::vector<std::string> names;
    const auto look = [&](const Channel& channel, const std::string& name) {
        if (writesTo(*channel.made, appender)) names.push_back(name);
    };
    look(root, "the root");
    for (const Channel& category : categories)
        look(category, visible(category.name));
    return names;
}

std::string Configuration::nameOf(const LogAppender* made) const {
    return appenderOf(made)->name;
}
