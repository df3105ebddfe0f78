#include "Text.h"
#include "findings/Findings.h"
#include "findings/Levels.h"

// Levels that no logger has a method for.
void findInLevels(const Reading& reading, Findings& to) {
    for (const ConfigStatement* const said : reading.config.appliedValues()) {
        const Piece value = valueOf(reading.source, *said);
        std::size_t from = 0;
        for (const std::string& word : wordsOf(said->value)) {
            from = said->value.find(word, from);
            const Place place = value.part(from, word.size()).place();
            from += word.size();
            const std::string logged = isLevel(word) ? firstLoggedLevel(word) : word;
            if (logged == word) continue;
            const bool root = said->kind == ConfigStatement::ROOT;
            const std::string who = root ? "the root, and each channel without a level of its own,"
                                         : "category " + quoted(said->name);
            if (logged.empty()) {
                tell(to, Code::LEVEL_SILENT, place,
                     "nothing is logged at " + word + ": " + who +
                         " is silent, FATAL messages included");
            } else {
                tell(to, Code::LEVEL_UNUSED, place,
                     "nothing is logged at " + word + ": it lets pass what " + logged + " does",
                     logged);
            }
        }
    }
}
