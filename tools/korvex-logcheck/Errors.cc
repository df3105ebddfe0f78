#include "Findings.h"
#include "Text.h"

namespace {

// Why a category's value, or the root's, was not accepted.
std::string explainWords(const std::string& value) {
    std::vector<std::string> bad;
    bool wrongCase = false;
    bool hash = false;
    for (const std::string& word : wordsOf(value)) {
        if (isLevelWord(word) || LogAppender::find(word, false) != nullptr) continue;
        bad.push_back(quoted(word));
        wrongCase = wrongCase || isLevelWord(word, true);
        hash = hash || word.back() == '#';
    }
    if (bad.empty()) return "";
    return listed(bad) + (bad.size() == 1 ? " is" : " are") + " neither a level nor an appender" +
           (wrongCase ? "; levels are in upper case" : "") +
           (hash ? "; a \"#\" right behind a word belongs to it" : "");
}

std::string explainAttribute(const ConfigStatement& said) {
    if (said.attribute == "layout") {
        return "the layouts are BasicLayout, SimpleLayout and PatternLayout";
    }
    if (said.attribute == "maxFileSize" || said.attribute == "maxBackupIndex") {
        return quoted(said.value) + " is no plain number: digits only, nothing behind them";
    }
    return "the attributes are fileName, maxFileSize, maxBackupIndex, layout and "
           "layout.ConversionPattern";
}

std::string explain(const Configuration& config, const DeferedLogConf& error) {
    for (const ConfigStatement& said : config.root.statements) {
        if (said.lineno == error.lineno) return explainWords(said.value);
    }
    for (const Channel& category : config.categories) {
        for (const ConfigStatement& said : category.statements) {
            if (said.lineno == error.lineno) return explainWords(said.value);
        }
    }
    for (const Appender* const appender : config.everyAppender()) {
        for (const ConfigStatement& said : appender->attributes) {
            if (said.lineno == error.lineno) return explainAttribute(said);
        }
    }
    return "lines are rootCategory=..., category.NAME=..., appender.NAME=... and "
           "appender.NAME.ATTRIBUTE=...";
}

}  // namespace

void findErrors(const Configuration& config, Findings& to) {
    if (config.openComment != ConfigLines::kNone) {
        to.push_back({config.openComment, true, "Unterminated XML comment started"});
    }
    for (const DeferedLogConf& error : config.parseErrors) {
        to.push_back({error.lineno, true,
                      "Parse error at " + quoted(error.context) + ": " + explain(config, error)});
    }
}
