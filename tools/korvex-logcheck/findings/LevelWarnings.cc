#include "Text.h"
#include "findings/Findings.h"
#include "findings/Levels.h"

namespace {

// The level that counts: the last one of all its lines. None when they name none.
std::optional<Piece> levelOf(const Source& source, const Channel& channel, bool root) {
    std::optional<Piece> last;
    for (const ConfigStatement& said : channel.statements) {
        if (root && &said != &channel.statements.back()) continue;
        const Piece value = valueOf(source, said);
        std::size_t from = 0;
        for (const std::string& word : wordsOf(said.value)) {
            from = said.value.find(word, from);
            if (isLevel(word)) last.emplace(value.part(from, word.size()));
            from += word.size();
        }
    }
    return last;
}

void checkLevel(const Piece& word, const std::string& who, Findings& to) {
    const std::string level(word.text());
    const std::string logged = firstLoggedLevel(level);
    if (logged == level) return;
    if (logged.empty()) {
        tell(to, Code::LEVEL_SILENT, word.place(),
             "nothing is logged at " + level + ": " + who + " is silent, FATAL messages included");
    } else {
        tell(to, Code::LEVEL_UNUSED, word.place(),
             "nothing is logged at " + level + ": it lets pass what " + logged + " does", logged);
    }
}

}  // namespace

// Levels that no logger has a method for.
void findInLevels(const Reading& reading, Findings& to) {
    if (const auto level = levelOf(reading.source, reading.config.root, true)) {
        checkLevel(*level, "the root, and each channel without a level of its own,", to);
    }
    for (const Channel& category : reading.config.categories) {
        const auto level = levelOf(reading.source, category, false);
        if (level) checkLevel(*level, "category " + quoted(category.name), to);
    }
}
