#include "findings/Code.h"

#include <cstddef>

namespace {

using S = Severity;
using M = Mended;

// In the order of the enumeration.
constexpr CodeRow kRows[] = {
    {Code::BYTES_CRLF, "bytes.crlf", S::ERROR, M::YES,
     "lines end as on Windows: the last word of each keeps a carriage return"},
    {Code::BYTES_MARK, "bytes.mark", S::ERROR, M::YES,
     "the file begins with a byte order mark, which becomes part of the first line"},
    {Code::BYTES_UTF16, "bytes.utf16", S::ERROR, M::NO, "the file is UTF-16"},
    {Code::BYTES_NUL, "bytes.nul", S::ERROR, M::NO,
     "a NUL byte: the rest of its line is lost and the next line is joined to it"},
    {Code::BYTES_CONTROL, "bytes.control", S::WARNING, M::NO, "a control character"},
    {Code::BYTES_UTF8, "bytes.utf8", S::WARNING, M::NO, "bytes that are no UTF-8"},
    {Code::COMMENT_OPEN, "comment.open", S::ERROR, M::NO,
     "an XML comment without an end: the rest of the file is not read"},
    {Code::KEY_CASE, "key.case", S::ERROR, M::YES, "a key in the wrong case"},
    {Code::KEY_PREFIX, "key.prefix", S::ERROR, M::YES,
     "a prefix other than log4cpp. in front of a key"},
    {Code::KEY_OTHER_NAME, "key.other-name", S::ERROR, M::YES,
     "a key as other logging libraries call it"},
    {Code::KEY_COLON, "key.colon", S::ERROR, M::YES, "a colon instead of the equals sign"},
    {Code::KEY_ADDITIVITY, "key.additivity", S::ERROR, M::NO, "additivity, which there is not"},
    {Code::KEY_UNKNOWN, "key.unknown", S::ERROR, M::NO, "any other line that means nothing"},
    {Code::ATTRIBUTE_UNKNOWN, "attribute.unknown", S::ERROR, M::NO,
     "an attribute that appenders do not have"},
    {Code::WORD_UNKNOWN, "word.unknown", S::ERROR, M::NO,
     "a word that is neither a level nor an appender"},
    {Code::WORD_HASH, "word.hash", S::ERROR, M::YES, "a # directly after a word is part of it"},
    {Code::LEVEL_CASE, "level.case", S::ERROR, M::YES, "a level in the wrong case"},
    {Code::LEVEL_OTHER_NAME, "level.other-name", S::ERROR, M::YES,
     "a level as other logging libraries call it"},
    {Code::LEVEL_SILENT, "level.silent", S::WARNING, M::NO,
     "EMERG, at which nothing is logged: the channel is silent"},
    {Code::LEVEL_UNUSED, "level.unused", S::NOTE, M::NO,
     "a level at which nothing is logged: it means the next higher one"},
    {Code::NUMBER_UNIT, "number.unit", S::ERROR, M::WHERE_SURE, "a number with a unit"},
    {Code::NUMBER_FORM, "number.form", S::ERROR, M::WHERE_SURE,
     "a number that is not just digits, or that begins with a zero"},
    {Code::LAYOUT_CLASS, "layout.class", S::ERROR, M::WHERE_SURE,
     "a class name in front of a layout"},
    {Code::LAYOUT_CASE, "layout.case", S::ERROR, M::YES, "a layout in the wrong case or cut short"},
    {Code::LAYOUT_UNKNOWN, "layout.unknown", S::ERROR, M::NO, "a layout that there is not"},
    {Code::VALUE_REFUSED_TAIL, "value.refused-tail", S::ERROR, M::WHERE_SURE,
     "a value that is refused for the blank or # after it"},
    {Code::VALUE_TAIL, "value.tail", S::WARNING, M::WHERE_SURE,
     "a value that keeps the blank or # after it"},
    {Code::CATEGORY_ROOT, "category.root", S::WARNING, M::NO,
     "a category that is called like the root"},
    {Code::CATEGORY_WILDCARD, "category.wildcard", S::WARNING, M::NO,
     "a wildcard in a category's name"},
    {Code::CATEGORY_ATTRIBUTE, "category.attribute", S::WARNING, M::NO,
     "a category with an attribute, of which it has none"},
    {Code::CATEGORY_CASE, "category.case", S::WARNING, M::NO,
     "two categories that differ in case only"},
    {Code::CATEGORY_LEVEL_NAME, "category.level-name", S::WARNING, M::NO,
     "a category that is spelt like a level"},
    {Code::CATEGORY_BLANK, "category.blank", S::WARNING, M::NO,
     "a category without a name, or with a blank, a comma or quotation marks in it"},
    {Code::CATEGORY_REPEATED, "category.repeated", S::WARNING, M::NO, "a category set twice"},
    {Code::CATEGORY_REPLACED, "category.replaced", S::WARNING, M::NO,
     "a root category that a later line replaces"},
    {Code::CATEGORY_EMPTY, "category.empty", S::WARNING, M::NO,
     "a category that is given no level and no appender"},
    {Code::CATEGORY_LEVELS, "category.levels", S::WARNING, M::NO, "a category with several levels"},
    {Code::CATEGORY_TWICE, "category.twice", S::WARNING, M::NO,
     "a category that names an appender twice"},
    {Code::APPENDER_TWICE, "appender.twice", S::WARNING, M::NO, "an appender declared twice"},
    {Code::APPENDER_UNUSED, "appender.unused", S::WARNING, M::NO, "an appender that nobody uses"},
    {Code::APPENDER_LEVEL_NAME, "appender.level-name", S::WARNING, M::NO,
     "an appender that is spelt like a level, so that nobody can name it"},
    {Code::APPENDER_STDERR, "appender.stderr", S::NOTE, M::NO,
     "an appender on standard error, of which every start says so"},
    {Code::APPENDER_NO_FILE, "appender.no-file", S::WARNING, M::NO,
     "an appender of files or with limits that has no file name"},
    {Code::APPENDER_ROOT, "appender.root", S::WARNING, M::NO,
     "a file or limits for rootAppender, which stays on standard error"},
    {Code::ATTRIBUTE_REPEATED, "attribute.repeated", S::WARNING, M::NO,
     "an attribute that is set twice"},
    {Code::FILE_SAME, "file.same", S::WARNING, M::NO, "two appenders with one file"},
    {Code::FILE_BACKUP, "file.backup", S::WARNING, M::NO,
     "a file that is another appender's backup"},
    {Code::FILE_DIRECTORY, "file.directory", S::WARNING, M::NO,
     "a file name that is a directory's, or the bare home"},
    {Code::FILE_RELATIVE, "file.relative", S::WARNING, M::NO,
     "a relative file name: it depends on where the program starts"},
    {Code::FILE_VARIABLE, "file.variable", S::WARNING, M::NO,
     "a variable, a ~ or a date that is not replaced"},
    {Code::FILE_HOME, "file.home", S::WARNING, M::WHERE_SURE,
     "${KORVEX_HOME} in another form, or without a / after it"},
    {Code::FILE_QUOTED, "file.quoted", S::WARNING, M::YES, "quotation marks around a file name"},
    {Code::LIMIT_SMALL, "limit.small", S::WARNING, M::NO, "a file size of a line or so"},
    {Code::LIMIT_NO_BACKUP, "limit.no-backup", S::WARNING, M::NO,
     "a file size without backups: the file begins again empty"},
    {Code::LIMIT_BACKUPS, "limit.backups", S::WARNING, M::NO, "more backups than anybody has"},
    {Code::LIMIT_HUGE, "limit.huge", S::WARNING, M::NO, "a file size too large to be a limit"},
    {Code::LIMIT_NO_SIZE, "limit.no-size", S::WARNING, M::NO, "backups without a file size"},
    {Code::LIMIT_NO_FILE, "limit.no-file", S::WARNING, M::NO, "limits without a file name"},
    {Code::LAYOUT_OVERRULED, "layout.overruled", S::WARNING, M::NO,
     "a layout and a pattern of which one overrules the other"},
    {Code::LAYOUT_NO_PATTERN, "layout.no-pattern", S::WARNING, M::NO,
     "PatternLayout without a pattern"},
    {Code::PATTERN_UNKNOWN, "pattern.unknown", S::WARNING, M::WHERE_SURE,
     "an unknown conversion, which prints nothing"},
    {Code::PATTERN_WORD, "pattern.word", S::WARNING, M::WHERE_SURE,
     "a conversion spelt out, of which only the first letter counts"},
    {Code::PATTERN_CUT, "pattern.cut", S::WARNING, M::NO,
     "a conversion that the pattern's end cuts"},
    {Code::PATTERN_HASH, "pattern.hash", S::WARNING, M::NO,
     "a # in a pattern, where a comment begins"},
    {Code::PATTERN_ARGUMENT, "pattern.argument", S::WARNING, M::YES,
     "an argument in braces where none counts"},
    {Code::PATTERN_NO_MESSAGE, "pattern.no-message", S::WARNING, M::NO, "a pattern without %m"},
    {Code::PATTERN_QUOTED, "pattern.quoted", S::WARNING, M::YES,
     "quotation marks around a pattern"},
    {Code::PATTERN_BACKSLASH, "pattern.backslash", S::WARNING, M::YES,
     "\\n, \\r or \\t in a pattern, which are printed as they are"},
    {Code::PATTERN_NO_NEWLINE, "pattern.no-newline", S::WARNING, M::NO,
     "a layout whose lines do not end"},
    {Code::PATTERN_WIDTH, "pattern.width", S::WARNING, M::NO,
     "a layout that asks for a width of six digits"},
    {Code::PATTERN_FAILS, "pattern.fails", S::WARNING, M::NO, "a layout that fails"},
    {Code::DATE_JAVA, "date.java", S::WARNING, M::WHERE_SURE, "a date in the Java form"},
    {Code::DATE_NAME, "date.name", S::WARNING, M::YES, "a named date layout misspelt"},
    {Code::DATE_TEXT, "date.text", S::WARNING, M::NO,
     "a date, or a letter of it, without a conversion, which prints its own text"},
    {Code::DATE_UNKNOWN, "date.unknown", S::WARNING, M::WHERE_SURE,
     "a conversion that strftime does not know, or one cut short"},
    {Code::DATE_MINUTES, "date.minutes", S::WARNING, M::YES,
     "months where minutes are meant, or the other way"},
    {Code::DATE_MILLISECONDS, "date.milliseconds", S::WARNING, M::NO,
     "milliseconds that are none, or none meant"},
    {Code::PATH_MISSING, "path.missing", S::ERROR, M::NO, "--paths: a directory is missing"},
    {Code::PATH_NO_DIRECTORY, "path.no-directory", S::ERROR, M::NO,
     "--paths: a file stands where a directory is meant, or the other way"},
    {Code::PATH_DENIED, "path.denied", S::ERROR, M::NO, "--paths: the file may not be written"},
    {Code::PATH_NO_ROTATION, "path.no-rotation", S::WARNING, M::NO,
     "--paths: the file may be written but not renamed, so it grows beyond its limit"},
};

constexpr std::size_t kCount = static_cast<std::size_t>(Code::COUNT);
static_assert(sizeof kRows / sizeof *kRows == kCount, "each code has a row");

constexpr bool isInOrder() {
    for (std::size_t i = 0; i < kCount; ++i) {
        if (static_cast<std::size_t>(kRows[i].code) != i) return false;
    }
    return true;
}
static_assert(isInOrder(), "rows stand in the order of the codes");

}  // namespace

const CodeRow& rowOf(Code code) {
    return kRows[static_cast<std::size_t>(code)];
}

std::string_view nameOf(Severity severity) {
    if (severity == Severity::ERROR) return "error";
    return severity == Severity::WARNING ? "warning" : "note";
}

std::string_view nameOf(Mended mended) {
    if (mended == Mended::YES) return "yes";
    return mended == Mended::WHERE_SURE ? "where sure" : "no";
}
