#pragma once

#include <string_view>

// What is found. Each has a row in the table, by which it is shown and documented.
enum class Code {
    BYTES_CRLF,
    BYTES_MARK,
    BYTES_UTF16,
    BYTES_NUL,
    BYTES_CONTROL,
    BYTES_UTF8,
    COMMENT_OPEN,
    KEY_CASE,
    KEY_PREFIX,
    KEY_OTHER_NAME,
    KEY_COLON,
    KEY_ADDITIVITY,
    KEY_UNKNOWN,
    ATTRIBUTE_UNKNOWN,
    WORD_UNKNOWN,
    WORD_HASH,
    LEVEL_CASE,
    LEVEL_OTHER_NAME,
    LEVEL_SILENT,
    LEVEL_UNUSED,
    NUMBER_UNIT,
    NUMBER_FORM,
    LAYOUT_CLASS,
    LAYOUT_CASE,
    LAYOUT_UNKNOWN,
    VALUE_REFUSED_TAIL,
    VALUE_TAIL,
    CATEGORY_ROOT,
    CATEGORY_WILDCARD,
    CATEGORY_ATTRIBUTE,
    CATEGORY_CASE,
    CATEGORY_LEVEL_NAME,
    CATEGORY_BLANK,
    CATEGORY_REPEATED,
    CATEGORY_REPLACED,
    CATEGORY_EMPTY,
    CATEGORY_LEVELS,
    CATEGORY_TWICE,
    APPENDER_TWICE,
    APPENDER_UNUSED,
    APPENDER_LEVEL_NAME,
    APPENDER_STDERR,
    APPENDER_NO_FILE,
    APPENDER_ROOT,
    ATTRIBUTE_REPEATED,
    FILE_SAME,
    FILE_BACKUP,
    FILE_DIRECTORY,
    FILE_RELATIVE,
    FILE_VARIABLE,
    FILE_HOME,
    FILE_QUOTED,
    LIMIT_SMALL,
    LIMIT_NO_BACKUP,
    LIMIT_BACKUPS,
    LIMIT_HUGE,
    LIMIT_NO_SIZE,
    LIMIT_NO_FILE,
    LAYOUT_OVERRULED,
    LAYOUT_NO_PATTERN,
    PATTERN_UNKNOWN,
    PATTERN_WORD,
    PATTERN_CUT,
    PATTERN_HASH,
    PATTERN_ARGUMENT,
    PATTERN_NO_MESSAGE,
    PATTERN_QUOTED,
    PATTERN_BACKSLASH,
    PATTERN_NO_NEWLINE,
    PATTERN_WIDTH,
    PATTERN_FAILS,
    DATE_JAVA,
    DATE_NAME,
    DATE_TEXT,
    DATE_UNKNOWN,
    DATE_MINUTES,
    DATE_MILLISECONDS,
    PATH_MISSING,
    PATH_NO_DIRECTORY,
    PATH_DENIED,
    PATH_NO_ROTATION,
    COUNT
};

// NOTE: worth knowing, but no reason to complain. ERROR: the library passes over it, or messages
// are lost.
enum class Severity { NOTE, WARNING, ERROR };

// Whether --fix mends it: where it is sure what was meant.
enum class Mended { NO, WHERE_SURE, YES };

struct CodeRow {
    Code code;
    std::string_view name;
    Severity severity;
    Mended mended;
    std::string_view meaning;
};

const CodeRow& rowOf(Code code);

// "error", "warning", "note".
std::string_view nameOf(Severity severity);
// "yes", "where sure", "no".
std::string_view nameOf(Mended mended);
