#include "Output.h"

#include <unistd.h>

#include "Progress.h"
#include "support/StandardOutput.h"
#include "support/TerminalQuery.h"

void write(std::string_view bytes) {
    static const bool isShown = isTerminal(STDOUT_FILENO);
    if (isShown) progressAside();
    writeOutput(bytes);
}
