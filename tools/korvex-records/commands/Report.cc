#include "commands/Report.h"

#include "terminal/Output.h"
#include "text/Counted.h"

void reportChange(const RecordMemory::Counts& counts, bool isOnlyTried) {
    write(counted(counts.added, "record") + (isOnlyTried ? " would be" : "") + " added, " +
          std::to_string(counts.changed) + " changed, " + std::to_string(counts.removed) +
          " removed\n");
}
