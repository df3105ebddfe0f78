#pragma once

#include <string>
#include <vector>

#include "export/LineShape.h"

// The file of an appender, as the engines' configurations speak of it.
struct ExportedFile {
    std::string appender;
    std::string id;  // the appender's name in lower case letters, digits and underscores; unique
    std::string path;
    LineShape shape;
};

using ExportedFiles = std::vector<ExportedFile>;

// What an engine cannot be told of a line.
class Inexpressible : public std::runtime_error {
  public:
    using std::runtime_error::runtime_error;
};

struct Engine {
    const char* name;
    const char* what;  // for --export list
    // The engine's configuration for the files, made from the configuration `source`. Throws
    // Inexpressible.
    std::string (*write)(const ExportedFiles& files, const std::string& source);
};

const std::vector<Engine>& engines();

// What engines() is made of.
std::string writeLnav(const ExportedFiles& files, const std::string& source);
std::string writeRsyslog(const ExportedFiles& files, const std::string& source);
std::string writeSyslogNg(const ExportedFiles& files, const std::string& source);
std::string writeFluentBit(const ExportedFiles& files, const std::string& source);
std::string writeVector(const ExportedFiles& files, const std::string& source);
std::string writeLoki(const ExportedFiles& files, const std::string& source);
std::string writeLogstash(const ExportedFiles& files, const std::string& source);
std::string writePcre(const ExportedFiles& files, const std::string& source);

// The fields that the lines have, without repetitions and the message, in their order.
std::vector<const LineField*> namedFields(const LineShape& shape);

// "# MARK..." for the first lines of a file.
std::string remark(const std::string& engine, const std::string& source);
