#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include <gmock/gmock.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

#include <cerrno>
#include <csignal>
#include <random>
#include <string>
#include <vector>

#include "support/Child.h"
#include "support/TempDir.h"

namespace {

using testing::ElementsAre;
using testing::IsEmpty;
using testing::UnorderedElementsAre;
using testsupport::readFile;
using testsupport::runInChild;
using testsupport::TempDir;
using testsupport::writeFile;

Pathname p(const std::string& s) {
    return Pathname(s);
}

TEST(PathnameTest, Constants) {
    EXPECT_EQ(Pathname::sep, '/');
    EXPECT_EQ(Pathname::root, "/");
    EXPECT_EQ(Pathname::cur, ".");
    EXPECT_EQ(Pathname::parent, "..");
    EXPECT_EQ(Pathname("abc", 2), "ab");
    EXPECT_EQ(Pathname(), "");
}

TEST(PathnameTest, JoiningPutsExactlyOneSeparator) {
    const struct {
        const char *left, *right, *joined;
    } all[] = {
        {"", "b", "/b"},      {"a", "b", "a/b"}, {"a/", "/b", "a/b"}, {"a", "///", "a/"},
        {"a/", "/", "a/"},    {"a", "", "a"},    {"", "", ""},        {"a", "//b//c/", "a/b//c/"},
        {"a//", "b", "a//b"}, {"/", "b", "/b"},  {"", "/", "/"},      {"", "//b", "/b"}};
    for (const auto& t : all) {
        EXPECT_EQ(p(t.left) / t.right, t.joined);
        EXPECT_EQ(p(t.left) / std::string(t.right), t.joined);
        Pathname inPlace(t.left);
        EXPECT_EQ(&(inPlace /= t.right), &inPlace);
        EXPECT_EQ(inPlace, t.joined);
    }
}

TEST(PathnameTest, APathCanBeJoinedWithItself) {
    Pathname a("a");
    const Pathname& self = a;  // clang++ warns of the plain way
    a /= self;
    EXPECT_EQ(a, "a/a");
    Pathname b("a");
    b /= b.c_str();
    EXPECT_EQ(b, "a/a");
}

TEST(PathnameTest, AbsoluteAndContainsSep) {
    EXPECT_TRUE(p("/").isAbsolute() && p("/a").isAbsolute());
    EXPECT_FALSE(p("").isAbsolute() || p("a/").isAbsolute());
    EXPECT_TRUE(p("a/b").containsSep() && p("/").containsSep());
    EXPECT_FALSE(p("").containsSep() || p("ab").containsSep());
}

TEST(PathnameTest, Leaf) {
    const char* const all[][2] = {{"", "/"},       {"/", "/"},    {"///", "/"},
                                  {"/a/b//", "b"}, {"b", "b"},    {"b/", "b"},
                                  {"/b", "b"},     {"a//b", "b"}, {"a/b/..", ".."}};
    for (const auto& t : all)
        EXPECT_EQ(p(t[0]).toLeaf(), t[1]) << t[0];
}

const std::string leafBeforeStatics = Pathname().toLeaf();

TEST(PathnameTest, LeafWorksInStaticInitialisersAndAtExit) {
    EXPECT_EQ(leafBeforeStatics, "/");
    const auto result = runInChild([] {
        std::atexit([] { fputs(Pathname().toLeaf().c_str(), stdout); });
        return 0;
    });
    EXPECT_EQ(result.out, "/");
}

TEST(PathnameTest, ParentAndStripElement) {
    const char* const all[][2] = {{"", ""},       {"a", ""},    {"abc/", ""},   {"a///", ""},
                                  {"/a", "/"},    {"/", "/"},   {"///", "/"},   {"/a/b/", "/a"},
                                  {"a//b", "a"},  {"//a", "/"}, {"//a//", "/"}, {"a/b//c//", "a/b"},
                                  {"/a//b", "/a"}};
    for (const auto& t : all) {
        const Pathname path(t[0]);
        EXPECT_EQ(path.toParent(), t[1]) << t[0];
        EXPECT_EQ(path, t[0]);
        Pathname stripped(path);
        stripped.stripElement();
        EXPECT_EQ(stripped, t[1]) << t[0];
    }
}

TEST(PathnameTest, Extension) {
    const char* const all[][2] = {
        {"a.tar.gz", "gz"}, {"x.", ""},   {"d.x/f", ""}, {".rc", "rc"},
        {"", ""},           {"a", ""},    {"a.b/", ""},  {"d/.profile", "profile"},
        {".", ""},          {"..", ""},   {"..a", "a"},  {"a..b", "b"},
        {"a.b/c.d", "d"},   {".a/b", ""}, {"x", ""},     {"/", ""}};
    for (const auto& t : all)
        EXPECT_EQ(p(t[0]).ext(), t[1]) << t[0];
}

TEST(PathnameTest, BasenameWithoutExtension) {
    const char* const all[][2] = {
        {"a.b.c", "a.b"}, {".rc", ".rc"}, {"/x/", ""},     {"x/.profile", ".profile"},
        {"", ""},         {"a", "a"},     {"/d.x/f", "f"}, {"d.x/f.g", "f"},
        {"x.", "x"},      {"..a", "."},   {".a.b", ".a"},  {"..", "."},
        {".", "."},       {"d/..", "."}};
    for (const auto& t : all)
        EXPECT_EQ(p(t[0]).basenameWithoutExt(), t[1]) << t[0];
}

TEST(PathnameTest, TrailingSeparators) {
    const char* const added[][2] = {
        {"", "/"}, {"a", "a/"}, {"a/", "a/"}, {"a//", "a//"}, {"/", "/"}};
    for (const auto& t : added) {
        Pathname path(t[0]);
        path.addTrailingSep();
        EXPECT_EQ(path, t[1]) << t[0];
    }
    const char* const removed[][2] = {{"a//", "a"}, {"//", "/"}, {"/", "/"},    {"a/", "a"},
                                      {"", ""},     {"a", "a"},  {"/a/", "/a"}, {"///", "/"}};
    for (const auto& t : removed) {
        Pathname path(t[0]);
        path.removeTrailingSeps();
        EXPECT_EQ(path, t[1]) << t[0];
    }
}

// How the two normalisations are defined: by deleting one occurrence and starting again.
std::string dotDotByRescanning(std::string s) {
    for (;;) {
        enum { START, INSIDE, DOT, DOTDOT } state = START;
        std::size_t i = 0;
        bool found = false;
        for (; i < s.size() && !found; ++i) {
            const char c = s[i];
            if (c == '/') {
                found = state == DOTDOT;
                state = START;
            } else if (c == '.' && state == START) {
                state = DOT;
            } else if (c == '.' && state == DOT) {
                state = DOTDOT;
            } else {
                state = INSIDE;
            }
        }
        if (found) {
            s.erase(i - 3, 3);
        } else if (state == DOTDOT) {
            if (s == "..") return "";
            s.erase(s.size() == 3 ? 1 : s.size() - 3);
        } else {
            return s;
        }
    }
}

std::string doubleSepsByRescanning(std::string s) {
    for (std::size_t at; (at = s.find("//")) != std::string::npos;)
        s.erase(at, 1);
    return s;
}

std::string withoutDotDot(const std::string& s) {
    Pathname path(s);
    path.removeDotDotSlash();
    return path;
}

TEST(NormalisationTest, DotDotElementsAreDeleted) {
    const char* const all[][2] = {{"a/../b", "a/b"},
                                  {"../x", "x"},
                                  {"/../a", "/a"},
                                  {"a/..", "a"},
                                  {"/..", "/"},
                                  {"..", ""},
                                  {"x/../", "x/"},
                                  {"a/b/../../c", "a/b/c"},
                                  {"./x", "./x"},
                                  {"...", "..."},
                                  {"..a", "..a"},
                                  {"a/..b", "a/..b"},
                                  {"../../etc", "etc"},
                                  {"../..", ""},
                                  {"/../..", "/"},
                                  {"//..", "/"},
                                  {"a//..", "a/"},
                                  {"a/../..", "a"},
                                  {"a..", "a.."},
                                  {"a../b", "a../b"},
                                  {"", ""},
                                  {".", "."},
                                  {"../", ""},
                                  {"./..", "."}};
    for (const auto& t : all)
        EXPECT_EQ(withoutDotDot(t[0]), t[1]) << t[0];
}

TEST(NormalisationTest, RandomPathsComeOutAsByRescanning) {
    std::mt19937 random(42);
    const std::string alphabet = "..//a";
    for (int i = 0; i < 200000; ++i) {
        std::string s(random() % 14, ' ');
        for (char& c : s)
            c = alphabet[random() % alphabet.size()];
        ASSERT_EQ(withoutDotDot(s), dotDotByRescanning(s)) << s;
        ASSERT_EQ(Pathname::removeDoubleSeps(s), doubleSepsByRescanning(s)) << s;
    }
}

TEST(NormalisationTest, DoubleSeparatorsCollapse) {
    const char* const all[][2] = {{"a///b", "a/b"},     {"//", "/"}, {"a//", "a/"},
                                  {"///", "/"},         {"", ""},    {"/a/b/", "/a/b/"},
                                  {"//a//b//", "/a/b/"}};
    for (const auto& t : all) {
        Pathname path(t[0]);
        path.removeDoubleSeps();
        EXPECT_EQ(path, t[1]);
        EXPECT_EQ(Pathname::removeDoubleSeps(t[0]), t[1]);
        EXPECT_EQ(Pathname::removeDoubleSeps(Pathname(t[0])), t[1]);
    }
}

TEST(NormalisationTest, AMillionElementsTakeNoQuadraticTime) {
    std::string dots;
    for (int i = 0; i < 1000000; ++i)
        dots += "../";
    EXPECT_EQ(withoutDotDot(dots + "x"), "x");
    EXPECT_EQ(Pathname::removeDoubleSeps(Pathname(std::string(1000000, '/'))), "/");
}

TEST(ShellQuotingTest, QuotesOnlyWhereNeeded) {
    const char* const all[][2] = {{"", "\"\""},
                                  {"abc", "abc"},
                                  {"a b", "\"a b\""},
                                  {"a\tb", "\"a\tb\""},
                                  {"a\nb", "\"a\nb\""},
                                  {"$HOME", "'$HOME'"},
                                  {"a\"b", "'a\"b'"},
                                  {"a\\b", "'a\\b'"},
                                  {"a;b", "a\\;b"},
                                  {"a*", "a\\*"},
                                  {"it's", "it\\'s"},
                                  {"it's $5", "\"it's \\$5\""},
                                  {"x(1)", "x(1)"},
                                  {"a $b", "'a $b'"},
                                  {"it's a \"x\" \\", "\"it's a \\\"x\\\" \\\\\""},
                                  {"it's;", "it\\'s\\;"},
                                  {"a ;b", "\"a ;b\""},
                                  {"'$", "\\'\\$"},
                                  {"'\"\\", "\\'\\\"\\\\"},
                                  {"()<>{}~!`\r\v\f", "()<>{}~!`\r\v\f"},
                                  {"\x80\xff", "\x80\xff"},
                                  {"#&*;=?[]|", "\\#\\&\\*\\;\\=\\?\\[\\]\\|"}};
    for (const auto& t : all)
        EXPECT_EQ(p(t[0]).shellQuoted(), t[1]) << t[0];
    EXPECT_EQ(p(std::string("a\0b", 3)).shellQuoted(), std::string("a\0b", 3));
}

struct Split {
    bool found;
    std::string arg, rest;
};

Split split(const std::string& s) {
    Pathname arg("before");
    std::string rest("untouched");
    const bool found = Pathname::splitArgShellQuoted(s, arg, rest);
    return {found, arg, rest};
}

bool operator==(const Split& a, const Split& b) {
    return a.found == b.found && a.arg == b.arg && a.rest == b.rest;
}

std::ostream& operator<<(std::ostream& out, const Split& s) {
    return out << s.found << " <" << s.arg << "> <" << s.rest << '>';
}

TEST(ShellQuotingTest, SplitsTheFirstWordOff) {
    EXPECT_EQ(split("abc"), (Split{true, "abc", ""}));
    EXPECT_EQ(split(" \t\nabc def"), (Split{true, "abc", " def"}));
    EXPECT_EQ(split("a\\ b c"), (Split{true, "a b", " c"}));
    EXPECT_EQ(split("'a b' c"), (Split{true, "a b", " c"}));
    EXPECT_EQ(split("\"a\\\"b\""), (Split{true, "a\"b", ""}));
    EXPECT_EQ(split("\"a\\nb\"\tx"), (Split{true, "anb", "\tx"})) << "any character is escaped";
    EXPECT_EQ(split("'a\\b'"), (Split{true, "a\\b", ""}));
    EXPECT_EQ(split("a'b'\"c\"d\n"), (Split{true, "abcd", "\n"}));
    EXPECT_EQ(split("\"'\"'\"'"), (Split{true, "'\"", ""}));
    EXPECT_EQ(split("a\\'"), (Split{true, "a'", ""}));
    EXPECT_EQ(split("'' x"), (Split{false, "", "untouched"}));
    EXPECT_EQ(split(std::string("a\0b c", 5)), (Split{true, std::string("a\0b", 3), " c"}));
}

TEST(ShellQuotingTest, BadInputLeavesTheRestAloneAndTheArgumentHoldsWhatWasRead) {
    EXPECT_EQ(split(""), (Split{false, "", "untouched"}));
    EXPECT_EQ(split("   "), (Split{false, "", "untouched"}));
    EXPECT_EQ(split("\"abc"), (Split{false, "abc", "untouched"}));
    EXPECT_EQ(split("'abc"), (Split{false, "abc", "untouched"}));
    EXPECT_EQ(split("abc\\"), (Split{false, "abc", "untouched"}));
    EXPECT_EQ(split("\"abc\\"), (Split{false, "abc", "untouched"}));
    EXPECT_EQ(split("''"), (Split{false, "", "untouched"}));
}

TEST(ShellQuotingTest, SplittingWorksInPlace) {
    std::string rest = "one 'two 2' three";
    Pathname arg;
    std::vector<std::string> words;
    while (Pathname::splitArgShellQuoted(rest, arg, rest))
        words.push_back(arg);
    EXPECT_THAT(words, ElementsAre("one", "two 2", "three"));
    Pathname same("x y");
    std::string tail;
    EXPECT_TRUE(Pathname::splitArgShellQuoted(same, same, tail));
    EXPECT_EQ(same, "x");
    EXPECT_EQ(tail, " y");
}

TEST(ShellQuotingTest, WhatWasQuotedSplitsBack) {
    std::mt19937 random(7);
    for (int i = 0; i < 20000; ++i) {
        std::string s(1 + random() % 8, ' ');
        for (char& c : s)
            c = "a '\"\\$;*\t\n#\x80"[random() % 12];
        EXPECT_EQ(split(p(s).shellQuoted()), (Split{true, s, ""}));
    }
}

TEST(PathListTest, SplitsAtSeparatorsAndSkipsEmptyPieces) {
    EXPECT_THAT(PathList("a::b:", ':'), ElementsAre("a", "b"));
    EXPECT_THAT(PathList("::", ':'), IsEmpty());
    EXPECT_THAT(PathList("", ':'), IsEmpty());
    EXPECT_THAT(PathList(std::string("x;y:z"), ';'), ElementsAre("x", "y:z"));
    EXPECT_THAT(PathList(std::string("a\0b", 3), ':'), ElementsAre("a"));
    EXPECT_THAT(PathList("ab", '\0'), ElementsAre("ab"));
    PathList list("b:a", ':');
    list.push_back_separated("b", PathList::listSep);
    EXPECT_THAT(list, ElementsAre("b", "a", "b"));
    EXPECT_EQ(PathList::listSep, ':');
}

TEST(PathListTest, TakesASetInItsOrder) {
    const std::set<Pathname> set{"b", "a", "c"};
    EXPECT_THAT(PathList(set.begin(), set.end()), ElementsAre("a", "b", "c"));
}

class FileSystemTest : public testing::Test {
  protected:
    Pathname path(const char* name) const { return Pathname(_dir.file(name)); }
    mode_t mode(const char* name) const {
        struct stat st {};
        EXPECT_EQ(::stat(_dir.file(name).c_str(), &st), 0);
        return st.st_mode & 07777;
    }

    TempDir _dir;
};

TEST_F(FileSystemTest, TypesAreTold) {
    writeFile(path("file"), "12345");
    ASSERT_EQ(symlink("file", path("link").c_str()), 0);
    ASSERT_EQ(mkfifo(path("fifo").c_str(), 0600), 0);
    const Pathname dir(_dir.path());
    EXPECT_TRUE(dir.isDir() && !dir.isReg() && dir.exists());
    EXPECT_TRUE(path("file").isReg() && !path("file").isDir());
    EXPECT_TRUE(path("link").isReg());
    EXPECT_FALSE(path("fifo").isReg() || path("fifo").isDir());
    // The types are numbers, not bits: a socket's holds a regular file's, a block device's a
    // directory's (which takes privileges to make).
    ASSERT_EQ(mknod(path("socket").c_str(), S_IFSOCK | 0600, 0), 0);
    EXPECT_FALSE(path("socket").isReg());
    if (mknod(path("block").c_str(), S_IFBLK | 0600, makedev(7, 0)) == 0) {
        EXPECT_FALSE(path("block").isDir());
    }
    EXPECT_FALSE(Pathname("/dev/null").isReg() || Pathname("/dev/null").isDir());
    errno = 0;
    EXPECT_FALSE(path("missing").exists());
    EXPECT_EQ(errno, ENOENT);
    EXPECT_FALSE(Pathname().isDir());
}

TEST_F(FileSystemTest, APlainNoLeavesErrnoAlone) {
    writeFile(path("file"), "");
    errno = 77;
    EXPECT_FALSE(path("file").isDir());
    EXPECT_TRUE(path("file").exists());
    EXPECT_EQ(errno, 77);
}

TEST_F(FileSystemTest, SizeAndTimeAreUntouchedOnFailure) {
    writeFile(path("file"), "12345");
    long long size = 99;
    time_t mtime = 99;
    EXPECT_FALSE(path("missing").getSize(&size) || path("missing").getMtime(&mtime));
    EXPECT_EQ(size, 99);
    EXPECT_EQ(mtime, 99);
    EXPECT_TRUE(path("file").getSize(&size) && path("file").getMtime(&mtime));
    EXPECT_EQ(size, 5);
    EXPECT_GT(mtime, 1000000000);
}

TEST_F(FileSystemTest, TruncateTakes64BitsWhereFileSizesDo) {
    writeFile(path("file"), "12345");
    EXPECT_TRUE(path("file").truncate(3));
    EXPECT_EQ(readFile(path("file")), "123");
    const bool wide = sizeof(off_t) == 8;
    errno = 0;
    EXPECT_EQ(path("file").truncate(5LL << 30), wide);
    EXPECT_EQ(errno, wide ? 0 : EFBIG);
    long long size = 0;
    EXPECT_TRUE(path("file").getSize(&size));
    EXPECT_EQ(size, wide ? 5LL << 30 : 3);
    errno = 0;
    EXPECT_FALSE(path("file").truncate(-1));
    EXPECT_EQ(errno, EINVAL);
}

TEST_F(FileSystemTest, AccessAsksForTheRightBits) {
    writeFile(path("file"), "");
    // Root may read and write everything, so ask as somebody else.
    const auto result = runInChild([&] {
        if (geteuid() == 0 && (chmod(_dir.path().c_str(), 0755) != 0 || setuid(65534) != 0))
            return 9;
        return (path("file").r_ok() ? 1 : 0) + (path("file").w_ok() ? 2 : 0) +
               (path("file").rw_ok() ? 4 : 0);
    });
    const auto with = [&](mode_t bits) {
        EXPECT_EQ(chmod(path("file").c_str(), bits), 0);
        return runInChild([&] {
                   if (geteuid() == 0 && setuid(65534) != 0) return 9;
                   return (path("file").r_ok() ? 1 : 0) + (path("file").w_ok() ? 2 : 0) +
                          (path("file").rw_ok() ? 4 : 0);
               })
            .status;
    };
    ASSERT_NE(result.status, 9);
    ASSERT_EQ(chmod(_dir.path().c_str(), 0755), 0);
    EXPECT_EQ(with(0444), 1);
    EXPECT_EQ(with(0222), 2);
    EXPECT_EQ(with(0666), 7);
    EXPECT_EQ(with(0111), 0);
}

TEST_F(FileSystemTest, MkdirModesUnderTheUmask) {
    const mode_t old = umask(0);
    EXPECT_TRUE(path("private").mkdir(Pathname::MKDIR_PRIVATE));
    EXPECT_TRUE(path("group").mkdir(Pathname::MKDIR_GROUP_RW));
    EXPECT_TRUE(path("public").mkdir(Pathname::MKDIR_PUBLIC));
    EXPECT_TRUE(path("world").mkdir(Pathname::MKDIR_WORLD_READ));
    umask(022);
    EXPECT_TRUE(path("public022").mkdir(Pathname::MKDIR_PUBLIC));
    EXPECT_TRUE(path("world022").mkdir(Pathname::MKDIR_WORLD_READ));
    umask(old);
    EXPECT_EQ(mode("private"), 0700U);
    EXPECT_EQ(mode("group"), 0770U);
    EXPECT_EQ(mode("public"), 0777U);
    EXPECT_EQ(mode("world"), 0755U);
    EXPECT_EQ(mode("public022"), 0755U);
    EXPECT_EQ(mode("world022"), 0755U);
    errno = 0;
    EXPECT_FALSE(path("world").mkdir(Pathname::MKDIR_PRIVATE));
    EXPECT_EQ(errno, EEXIST);
}

TEST_F(FileSystemTest, AnUnknownMkdirModeIsAnAssertion) {
    const auto result =
        runInChild([&] { return path("x").mkdir(static_cast<Pathname::MkdirMode>(4)) ? 0 : 1; });
    EXPECT_EQ(result.signal, SIGABRT);
    EXPECT_THAT(result.err,
                testing::MatchesRegex(
                    "src/util/Pathname.*:[0-9]+: failed assertion `mode == MKDIR_PRIVATE'\n"));
}

TEST_F(FileSystemTest, RemovingAndRenaming) {
    EXPECT_TRUE(path("d").mkdir(Pathname::MKDIR_PRIVATE));
    EXPECT_FALSE(path("d").unlink());
    EXPECT_TRUE(path("d").rmdir());
    EXPECT_TRUE(path("d").mkdir(Pathname::MKDIR_PRIVATE));
    EXPECT_TRUE(path("d").remove());
    writeFile(path("a"), "a");
    EXPECT_FALSE(path("a").rmdir());
    EXPECT_TRUE(path("a").renameTo(path("b")));
    EXPECT_THAT(_dir.names(), ElementsAre("b"));
    EXPECT_TRUE(path("b").remove());
    errno = 0;
    EXPECT_FALSE(path("b").unlink());
    EXPECT_EQ(errno, ENOENT);
    EXPECT_FALSE(path("b").renameTo(path("c")));
}

TEST_F(FileSystemTest, ReadlinkIsTrueOnlyForAnEmptyResult) {
    EXPECT_TRUE(Pathname("target").symlinkTo(path("link")));
    char buf[] = "................";
    EXPECT_FALSE(path("link").readlink(buf, sizeof buf));
    EXPECT_EQ(std::string(buf, 8), "target..") << "the link was read, without a NUL";
    EXPECT_TRUE(Pathname("t").symlinkTo(path("short")));
    EXPECT_FALSE(path("short").readlink(buf, sizeof buf)) << "one byte is not an empty result";
    EXPECT_FALSE(path("missing").readlink(buf, sizeof buf));
}

TEST_F(FileSystemTest, FopenGivesAStreamOrNull) {
    std::FILE* const file = path("file").fopen("w");
    ASSERT_NE(file, nullptr);
    std::fclose(file);
    EXPECT_EQ(path("missing").fopen("r"), nullptr);
    EXPECT_EQ(errno, ENOENT);
}

TEST_F(FileSystemTest, DirectoriesAreListedWithoutTheDots) {
    writeFile(path("a"), "");
    writeFile(path(".b"), "");
    DirectoryDescriptor dir = Pathname(_dir.path()).opendir();
    ASSERT_TRUE(dir.valid());
    std::vector<std::string> names;
    errno = 5;
    for (DirectoryEntry entry; dir.next(entry);) {
        names.push_back(entry.name());
        EXPECT_EQ(Pathname(entry), entry.name());
        EXPECT_EQ(Pathname("d") / entry, "d/" + entry.name());
    }
    EXPECT_EQ(errno, 5);
    EXPECT_THAT(names, UnorderedElementsAre("a", ".b"));
    EXPECT_TRUE(dir.close());
    EXPECT_TRUE(dir.close());
    DirectoryEntry entry;
    EXPECT_FALSE(dir.next(entry));
    EXPECT_EQ(errno, EBADF);
}

TEST_F(FileSystemTest, ADirectoryMovesFromOneObjectToAnother) {
    writeFile(path("a"), "");
    DirectoryDescriptor first = Pathname(_dir.path()).opendir();
    DirectoryDescriptor second(std::move(first));
    DirectoryEntry entry;
    EXPECT_TRUE(second.next(entry));
    DirectoryDescriptor third = path("missing").opendir();
    ASSERT_FALSE(third.valid());
    third = std::move(second);
    EXPECT_TRUE(third.valid());
    EXPECT_FALSE(third.next(entry)) << "it goes on where the other stood";
}

TEST_F(FileSystemTest, ADirectoryThatFailsUnderTheReaderTellsWhy) {
    const int number = dup(0);
    close(number);
    DirectoryDescriptor dir = Pathname(_dir.path()).opendir();
    ASSERT_TRUE(dir.valid());
    ASSERT_EQ(close(number), 0) << "the directory's own";
    DirectoryEntry entry;
    errno = 0;
    EXPECT_FALSE(dir.next(entry));
    EXPECT_EQ(errno, EBADF);
    errno = 0;
    EXPECT_FALSE(dir.close());
    EXPECT_EQ(errno, EBADF);
    EXPECT_FALSE(dir.valid());
    EXPECT_TRUE(dir.close()) << "there is nothing left to close";
}

TEST_F(FileSystemTest, AMissingDirectoryIsNotValid) {
    errno = 0;
    EXPECT_FALSE(path("missing").opendir().valid());
    EXPECT_EQ(errno, ENOENT);
}

}  // namespace
