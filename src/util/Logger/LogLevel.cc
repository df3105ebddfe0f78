#include <korvex/util/Logger/LogLevel.h>

#include "util/Logger/LevelWords.h"

inline namespace korvex {

const char* loglevel2str(unsigned long* len, LogLevel level) {
    for (const LevelWord& entry : kLevelWords) {
        if (entry.level == level) {
            *len = entry.word.size();
            return entry.word.data();
        }
    }
    *len = 3;
    return "???";
}

}  // namespace korvex
