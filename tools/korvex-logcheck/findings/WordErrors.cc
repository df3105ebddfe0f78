#include <algorithm>

#include "Text.h"
#include "findings/Findings.h"
#include "findings/Levels.h"
#include "findings/NearMiss.h"

namespace {

// What a word of a value, which is neither a level nor an appender, was meant to be.
struct Slip {
    Code code;
    std::string reason;
    std::string meant;
    bool sure;
};

bool isKnown(const Configuration& config, const std::string& word) {
    return isLevel(word) || config.hasAppender(word);
}

std::string nearest(const Configuration& config, const std::string& word) {
    const std::string low = lowered(word);
    if (low == "stderr" || low == "console" || low == "stdout") return "rootAppender";
    std::vector<std::string> names = levelNames();
    for (const Appender* const appender : config.everyAppender())
        names.push_back(appender->name);
    return nearestTo(word, names);
}

// As seen by who typed it: without what is not seen.
std::string seen(std::string_view word) {
    std::string ascii(word);
    ascii.erase(std::remove_if(ascii.begin(), ascii.end(),
                               [](char c) { return static_cast<unsigned char>(c) >= 0x80; }),
                ascii.end());
    return ascii;
}

// Behind a level no other one is sure: the word may be an appender that was forgotten.
Slip slipOf(const Configuration& config, const std::string& word, bool mayBeLevel) {
    if (word.back() == '#') {
        const std::string before = word.substr(0, word.size() - 1);
        return {Code::WORD_HASH, "; a \"#\" right after a word is part of it", before, true};
    }
    if (word == "\\")
        return {Code::WORD_UNKNOWN, "; a line cannot be continued on the next one", "", false};
    const std::string bare(withoutQuotes(word));
    const std::string reason = bare == word ? "" : "; quotation marks are part of the word";
    const std::string inUpperCase = levelInOtherCase(bare);
    if (!inUpperCase.empty()) {
        return {mayBeLevel ? Code::LEVEL_CASE : Code::WORD_UNKNOWN,
                "; levels are in upper case" + reason, inUpperCase, mayBeLevel};
    }
    const std::string level = levelOfOtherName(bare);
    if (!level.empty() && mayBeLevel) {
        return {Code::LEVEL_OTHER_NAME, "; that is a level name of other libraries" + reason, level,
                true};
    }
    std::string meant = isKnown(config, bare) ? bare : nearest(config, bare);
    if (meant.empty() && isKnown(config, seen(bare))) meant = seen(bare);
    return {Code::WORD_UNKNOWN, reason, meant, false};
}

// A value that names no appender that exists keeps the root's, or standard error.
std::string consequence(const Reading& reading, const ConfigStatement& said) {
    for (const std::string& word : wordsOf(said.value)) {
        if (!isLevel(word) && reading.config.hasAppender(word)) return "";
    }
    const bool root = said.kind == ConfigStatement::ROOT;
    std::vector<std::string> names;
    const LogChannel& channel =
        root ? *reading.config.root.made : *LogChannel::find(said.name, false);
    for (const LogAppender* const one : Configuration::destinations(channel))
        names.push_back(visible(reading.config.nameOf(one)));
    return std::string("; ") + (root ? "the root" : "the category") +
           " names no appender that exists, so it writes to " + listed(names);
}

void checkWord(const Reading& reading, const ConfigStatement& said, const Slip& slip,
               const Piece& word, const std::string& kept, Findings& to) {
    std::vector<Edit> edits;
    if (slip.sure) {
        edits = word.replacedBy(slip.code == Code::WORD_HASH ? slip.meant + " #" : slip.meant);
    }
    const bool level = slip.code == Code::LEVEL_CASE || slip.code == Code::LEVEL_OTHER_NAME;
    tell(to, slip.code, word.place(),
         parseError(reading, said.lineno) + quoted(shortened(word.text())) +
             " is neither a level nor an appender" + slip.reason + (level ? "" : kept),
         slip.meant, std::move(edits));
}

// What other libraries say of a category besides: one word, and no value of ours.
bool isAdditivity(const ConfigStatement& said, const std::string& word) {
    const std::string low = lowered(word);
    return endsWith(lowered(said.name), ".additivity") && (low == "false" || low == "true");
}

void checkValue(const Reading& reading, const ConfigStatement& said, Findings& to) {
    const Piece value = valueOf(reading.source, said);
    const std::vector<std::string> words = wordsOf(said.value);
    const std::string kept = consequence(reading, said);
    const bool hasLevel = std::any_of(words.begin(), words.end(), isLevel);
    std::size_t from = 0;
    for (const std::string& word : words) {
        from = said.value.find(word, from);
        const Piece piece = value.part(from, word.size());
        from += word.size();
        if (isKnown(reading.config, word)) continue;
        if (isAdditivity(said, word)) {
            tellAdditivity(to, piece.place(), parseError(reading, said.lineno));
        } else {
            const bool mayBeLevel = !hasLevel || word == words.front();
            checkWord(reading, said, slipOf(reading.config, word, mayBeLevel), piece, kept, to);
        }
    }
}

}  // namespace

void findInWords(const Reading& reading, Findings& to) {
    for (const ConfigStatement* const said : reading.config.appliedValues())
        checkValue(reading, *said, to);
}
