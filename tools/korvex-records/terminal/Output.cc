#include "terminal/Output.h"

#include <unistd.h>

#include "support/StandardOutput.h"
#include "support/TerminalQuery.h"
#include "terminal/Progress.h"

void write(std::string_view bytes) {
    static const bool isShown = isTerminal(STDOUT_FILENO);
    if (isShown) progressAside();
    writeOutput(bytes);
}
