// Prints a row of a table for each expression.
#include <korvex/util/Pathname.h>

#include <cstdio>

static void row(const char* expression, const std::string& result) {
    std::printf("| `%s` | %s%s%s |\n", expression, result.empty() ? "empty" : "`", result.c_str(),
                result.empty() ? "" : "`");
}

static Pathname changed(Pathname path, void (Pathname::*change)()) {
    (path.*change)();
    return path;
}

// The first shell word of the text, unquoted.
static std::string firstWord(const char* text) {
    Pathname word;
    std::string rest;
    return Pathname::splitArgShellQuoted(text, word, rest) ? word : "false";
}

#define ROW(expression) row(#expression, expression)
#define CHANGED(text, change) row(text "." #change "()", changed(text, &Pathname::change))
#define QUOTED(text) row("shellQuoted() of " text, Pathname(text).shellQuoted())
#define WORD(text) row("first word of " text, firstWord(text))

int main() {
    std::printf("| Expression | Result |\n|---|---|\n");
    ROW(Pathname("a") / "b");
    ROW(Pathname("a//") / "//b/");
    ROW(Pathname("") / "b");
    ROW(Pathname("a") / "");
    ROW(Pathname("/x/a.tar.gz").toLeaf());
    ROW(Pathname("/x/a.tar.gz").ext());
    ROW(Pathname("/x/a.tar.gz").basenameWithoutExt());
    ROW(Pathname(".profile").ext());
    ROW(Pathname(".profile").basenameWithoutExt());
    ROW(Pathname("a/b").toParent());
    ROW(Pathname("a").toParent());
    ROW(Pathname("/").toParent());
    ROW(Pathname("").toLeaf());
    CHANGED("a//b///", removeTrailingSeps);
    CHANGED("//", removeTrailingSeps);
    CHANGED("a//b///c", removeDoubleSeps);
    CHANGED("a/../b", removeDotDotSlash);
    CHANGED("../../etc", removeDotDotSlash);
    QUOTED("plain");
    QUOTED("two words");
    QUOTED("$cost");
    QUOTED("it's");
    QUOTED("a(b)");
    WORD("'two words' more");
    WORD("two\\ words more");
    WORD("'not closed");
}
