#include "export/Export.h"

#include <algorithm>

#include "Status.h"
#include "Text.h"
#include "export/Engines.h"
#include "support/StandardOutput.h"

namespace {

const Engine& engineOf(const std::string& name) {
    for (const Engine& engine : engines())
        if (name == engine.name) return engine;
    throw Failure("no engine " + quoted(name) + "; --export list shows them");
}

std::string idOf(const std::string& name, const ExportedFiles& others) {
    std::string id;
    for (const char c : name) {
        const bool upper = c >= 'A' && c <= 'Z';
        const bool plain = (c >= 'a' && c <= 'z') || (c >= '0' && c <= '9');
        id += upper ? static_cast<char>(c - 'A' + 'a') : plain ? c : '_';
    }
    const std::string first = id;
    const auto taken = [&](const ExportedFile& other) { return other.id == id; };
    for (int n = 2; std::any_of(others.begin(), others.end(), taken); ++n)
        id = first + '_' + std::to_string(n);
    return id;
}

void checkPath(const std::string& path) {
    if (path[0] == '$') throw Failure("its file name is not known; give --home");
    if (path[0] != '/') throw Failure("its file name is relative");
    if (path.find_first_of("\n\r") != path.npos) throw Failure("its file name has a newline");
}

void checkNames(const Configuration& config, const Appender& appender, const LineShape& shape) {
    for (const Channel& category : config.categories) {
        if (Configuration::writesTo(*category.made, *appender.made) && shape.hides(category.name)) {
            throw Failure("the name of category " + quoted(category.name) +
                          " has in it what ends it in the line");
        }
    }
}

// What the engines are told of the appender's file. Throws Failure.
ExportedFile fileOf(const Configuration& config, const Appender& appender,
                    const ExportedFiles& others) {
    const LogFormat& layout = appender.made->layout();
    try {
        checkPath(appender.made->fileName());
        ExportedFile file{appender.name, idOf(appender.name, others), appender.made->fileName(),
                          LineShape(layout)};
        for (const ExportedFile& other : others)
            if (other.path == file.path) throw Failure("another appender writes to its file");
        checkNames(config, appender, file.shape);
        return file;
    } catch (const Doubt& doubt) {
        throw Failure("lines of the layout " + quoted(layout.pattern()) +
                      " cannot be taken apart without doubt: " + doubt.what() +
                      "; this layout would do: " + LineShape::suggestion(layout));
    }
}

std::string about(const Appender& appender, const std::string& complaint) {
    return "appender " + quoted(appender.name) + ": " + printable(complaint);
}

}  // namespace

void listEngines() {
    for (const Engine& engine : engines()) {
        std::string name = engine.name;
        name.resize(12, ' ');
        writeOutput(name + engine.what + '\n');
    }
}

void exportTo(const std::string& engine, const Configuration& config, const Pathname& source,
              const std::optional<std::string>& appender) {
    const Engine& to = engineOf(engine);
    ExportedFiles files;
    std::string complaints;
    bool found = false;
    for (const Appender& one : config.appenders) {
        if (appender && one.name != *appender) continue;
        found = true;
        if (!one.made->writesToFile()) continue;
        try {
            files.push_back(fileOf(config, one, files));
            to.write({files.back()}, source);
        } catch (const Failure& failure) {
            complaints += (complaints.empty() ? "" : "\n") + about(one, failure.what());
        } catch (const Inexpressible& what) {
            complaints +=
                (complaints.empty() ? "" : "\n") +
                about(one, std::string(to.name) + " cannot be told its layout: " + what.what());
        }
    }
    if (!complaints.empty()) throw Failure(complaints);
    if (appender && !found) throw Failure("no appender " + quoted(*appender));
    if (files.empty()) throw Failure("no appender writes to a file");
    writeOutput(to.write(files, printable(source)));
}
