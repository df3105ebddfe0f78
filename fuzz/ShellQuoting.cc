#include <korvex/util/Pathname.h>

#include "Check.h"
#include "Input.h"
#include "reference/Shell.h"

namespace {

void checkQuoting(const Pathname& text) {
    const std::string word = text.shellQuoted();
    checkSame(word, reference::quoted(text), "shellQuoted");
    Pathname back;
    std::string rest = "untouched";
    const bool split = Pathname::splitArgShellQuoted(word + " more", back, rest);
    check(split == !text.empty(), "whether a quoted word is one");
    if (split) checkSame(back + "|" + rest, text + "| more", "a word read back");
    if (reference::isForAnyShell(text)) checkSame(reference::readByShell(word), text, "by a shell");
}

void checkSplitting(const std::string& text) {
    Pathname word;
    std::string rest = "untouched";
    const bool split = Pathname::splitArgShellQuoted(text, word, rest);
    const auto expected = reference::split(text);
    check(split == expected.has_value(), "whether there is a word");
    if (expected) checkSame(word, expected->word, "splitArgShellQuoted");
    checkSame(rest, expected ? expected->rest : "untouched", "the rest");
}

}  // namespace

// A text to quote, and to take for quoted.
extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size) {
    if (size > 2000) return 0;
    const std::string text = Input(data, size).rest();
    checkQuoting(Pathname(text));
    checkSplitting(text);
    return 0;
}
