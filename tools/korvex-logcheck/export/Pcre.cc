#include "export/Engines.h"
#include "export/Regex.h"

// A message goes on until a line begins as a message does.
std::string writePcre(const ExportedFiles& files, const std::string& source) {
    std::string all = remark("pcre", source);
    all +=
        "# Each matches a message of the file with the newline after it, and the next one when\n"
        "# matched again from there.\n";
    for (const ExportedFile& file : files) {
        const std::string begin = headRegex(file.shape, kPerlStyle, false).substr(1);
        all += "\n# " + file.appender + ": " + file.path + "\n(?m)" +
               headRegex(file.shape, kPerlStyle, true) + "(?<message>.*(?:\\n(?!" + begin +
               ").*)*)\\n\n";
    }
    return all;
}
