#include "crash-states/CrashStates.h"

#include <gmock/gmock.h>

#include <algorithm>
#include <set>
#include <string>
#include <vector>

// The model on histories made by hand, small enough to name every state.
namespace {

using namespace crashstates;
using testing::AllOf;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;
using testing::SizeIs;
using testing::UnorderedElementsAre;

constexpr Inode kOld = 1;
constexpr Inode kNew = 2;

// "a=text b=text", zeros as '0'; a name that shares its file with an earlier one as "b=a". What
// may be found after the last event has a '!' at its end.
std::string shown(const State& state, std::size_t events) {
    std::string text;
    std::map<Inode, std::string> first;
    for (const auto& [name, entry] : state.names) {
        std::string bytes = entry.file->bytes;
        std::replace(bytes.begin(), bytes.end(), '\0', '0');
        const auto [at, isNew] = first.try_emplace(entry.inode, name);
        text += (text.empty() ? "" : " ") + name + "=" + (isNew ? bytes : at->second);
        for (const auto& [attribute, value] : entry.file->attributes)
            text += isNew ? "," + attribute + ":" + value : "";
    }
    return text + (state.latest == events ? "!" : "");
}

std::vector<std::string> statesOf(const History& history, NameOrder order = NameOrder::OF_EACH) {
    const CrashStates states(history, {4, 1U << 14, order});
    EXPECT_TRUE(states.complete());
    std::vector<std::string> texts;
    for (const State& state : states.all())
        texts.push_back(shown(state, history.events.size()));
    return texts;
}

Directory directory(const std::string& name, const std::string& bytes) {
    return {{{name, kOld}}, {{kOld, {bytes, {}}}}};
}

TEST(CrashStates, AnEmptyHistoryLeavesWhatWas) {
    EXPECT_THAT(statesOf({directory("a", "x"), {}}), ElementsAre("a=x!"));
    EXPECT_THAT(statesOf({}), ElementsAre("!"));
}

TEST(CrashStates, ANewFileMayBeMissingOrEmptyOrZeros) {
    const History history{{}, {Create{"a", kNew, {}}, Write{kNew, 0, "xy"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("!", "a=!", "a=00!", "a=xy!"));
}

TEST(CrashStates, ASyncOfTheFileLeavesOnlyItsNameToChance) {
    const History history{{}, {Create{"a", kNew, {}}, Write{kNew, 0, "xy"}, SyncFile{kNew, false}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("!", "a=", "a=00", "a=xy!"));
}

TEST(CrashStates, ASyncOfTheDirectoryLeavesOnlyTheDataToChance) {
    const History history{{}, {Create{"a", kNew, {}}, Write{kNew, 0, "xy"}, SyncDirectory{}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("", "a=!", "a=00!", "a=xy!"));
}

TEST(CrashStates, AfterBothSyncsThereIsOneState) {
    const History history{
        {}, {Create{"a", kNew, {}}, Write{kNew, 0, "xy"}, SyncFile{kNew, true}, SyncDirectory{}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("", "a=", "a=00", "a=xy!"));
}

TEST(CrashStates, BlocksArriveInAnyCombinationAndTheSizeStopsAtTheirBounds) {
    const History history{directory("a", ""), {Write{kOld, 0, "abcdEFGHij"}}};
    EXPECT_THAT(statesOf(history),
                UnorderedElementsAre("a=!",                                              // size 0
                                     "a=0000!", "a=abcd!",                               // size 4
                                     "a=00000000!", "a=abcd0000!", "a=0000EFGH!",        // size 8
                                     "a=abcdEFGH!",                                      //
                                     "a=0000000000!", "a=abcd000000!",                   // size 10
                                     "a=0000EFGH00!", "a=abcdEFGH00!", "a=00000000ij!",  //
                                     "a=abcd0000ij!", "a=0000EFGHij!", "a=abcdEFGHij!"));
}

TEST(CrashStates, AnAppendKeepsWhatWasOnTheDisk) {
    const History history{directory("a", "ab"), {Write{kOld, 2, "cdef"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=ab!", "a=ab00!", "a=abcd!", "a=ab0000!",
                                                        "a=abcd00!", "a=ab00ef!", "a=abcdef!"));
}

TEST(CrashStates, TwoWritesToABlockArriveInTheirOrder) {
    const History history{directory("a", "...."), {Write{kOld, 0, "1"}, Write{kOld, 1, "2"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=....!", "a=1...!", "a=12..!"));
}

TEST(CrashStates, TwoWritesToTwoBlocksArriveInAnyOrder) {
    const History history{directory("a", "........"), {Write{kOld, 0, "1"}, Write{kOld, 4, "2"}}};
    EXPECT_THAT(statesOf(history),
                UnorderedElementsAre("a=........!", "a=1.......!", "a=....2...!", "a=1...2...!"));
}

TEST(CrashStates, AWriteInTheMiddleDoesNotShortenTheFile) {
    const History history{directory("a", "............"), {Write{kOld, 0, "abcdefgh"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=............!", "a=abcd........!",
                                                        "a=....efgh....!", "a=abcdefgh....!"));
}

TEST(CrashStates, WhatWasCutOffBeforeASyncDoesNotComeBack) {
    const History history{directory("a", "old"),
                          {Truncate{kOld, 0}, SyncFile{kOld, true}, Truncate{kOld, 3}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=old", "a=000!", "a=!"));
}

TEST(CrashStates, ATruncationMayComeWithoutTheDataAndTheDataWithoutIt) {
    const History history{directory("a", "old"), {Truncate{kOld, 0}, Write{kOld, 0, "n"}}};
    EXPECT_THAT(statesOf(history),
                UnorderedElementsAre("a=old!", "a=000!", "a=!", "a=n00!", "a=0!", "a=o!", "a=n!"));
}

TEST(CrashStates, AGrowingTruncationAddsZeros) {
    const History history{directory("a", "ab"), {Truncate{kOld, 6}, SyncFile{kOld, true}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=ab", "a=ab0000!"));
}

TEST(CrashStates, AWriteBehindTheEndLeavesZeros) {
    const History history{directory("a", "a"), {Write{kOld, 9, "z"}, SyncFile{kOld, true}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=a", "a=a000000000", "a=a00000000z!"));
}

TEST(CrashStates, ARenameIsThereOrNotAndMayComeBeforeTheData) {
    const History history{directory("a", "old"),
                          {Create{"t", kNew, {}}, Write{kNew, 0, "new"}, Rename{"t", "a"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=old!", "a=old t=!", "a=old t=000!",
                                                        "a=old t=new!", "a=!", "a=000!", "a=new!"));
}

TEST(CrashStates, AReplacementWithBothSyncsLeavesTheOldOrTheNew) {
    const History history{directory("a", "old"),
                          {Create{"t", kNew, {}}, Write{kNew, 0, "new"}, SyncFile{kNew, false},
                           Rename{"t", "a"}, SyncDirectory{}}};
    EXPECT_THAT(statesOf(history),
                UnorderedElementsAre("a=old", "a=old t=", "a=old t=000", "a=old t=new", "a=new!"));
}

TEST(CrashStates, AFileMayHaveTwoNamesUntilOneIsGone) {
    const History history{{},
                          {Create{"t", kNew, {}}, SyncDirectory{}, Link{kNew, "a"}, Unlink{"t"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("", "t=!", "a= t=a!", "a=!"));
}

TEST(CrashStates, ARenameBetweenTwoNamesOfOneFileDoesNothing) {
    const History history{directory("a", "x"), {Link{kOld, "b"}, Rename{"a", "b"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=x!", "a=x b=a!"));
}

TEST(CrashStates, TwoEqualFilesAreNotOneFile) {
    const History linked{directory("a", "x"), {Link{kOld, "b"}, SyncDirectory{}}};
    const History copied{
        directory("a", "x"),
        {Create{"b", kNew, {}}, SyncDirectory{}, Write{kNew, 0, "x"}, SyncFile{kNew, true}}};
    const History both{directory("a", "x"),
                       {Create{"b", kNew, {}}, Write{kNew, 0, "x"}, SyncFile{kNew, true},
                        SyncDirectory{}, Unlink{"b"}, Link{kOld, "b"}}};
    EXPECT_THAT(statesOf(linked), UnorderedElementsAre("a=x", "a=x b=a!"));
    EXPECT_THAT(statesOf(both),
                UnorderedElementsAre("a=x!", "a=x b=", "a=x b=0", "a=x b=x!", "a=x b=a!"));
    EXPECT_THAT(statesOf(copied), UnorderedElementsAre("a=x", "a=x b=", "a=x b=0", "a=x b=x!"));
}

TEST(CrashStates, AFileWithoutANameIsNotThere) {
    const History history{
        {}, {Create{"", kNew, {}}, Write{kNew, 0, "x"}, SyncFile{kNew, false}, Link{kNew, "a"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("!", "a=x!"));
}

TEST(CrashStates, ChangesOfDifferentNamesArriveInAnyOrder) {
    const History history{{}, {Create{"a", 1, {}}, Create{"b", 2, {}}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("!", "a=!", "b=!", "a= b=!"));
}

TEST(CrashStates, ChangesOfDifferentNamesMayKeepTheirOrder) {
    const History history{{}, {Create{"a", 1, {}}, Create{"b", 2, {}}}};
    EXPECT_THAT(statesOf(history, NameOrder::OF_ALL), UnorderedElementsAre("!", "a=!", "a= b=!"));
}

TEST(CrashStates, ChangesOfOneNameOrOneFileKeepTheirOrder) {
    const History rotation{{{{"l", 1}, {"l.1", 2}}, {{1, {"1", {}}}, {2, {"2", {}}}}},
                           {Unlink{"l.1"}, Rename{"l", "l.1"}, Create{"l", 3, {}}}};
    EXPECT_THAT(statesOf(rotation),
                UnorderedElementsAre("l=1 l.1=2!", "l=1!", "l.1=1!", "l= l.1=1!"));
}

TEST(CrashStates, AttributesComeWithASyncThatIsNotOfTheDataOnly) {
    const std::vector<Event> events{SetAttribute{kOld, "mode", "640"}};
    History history{{{{"a", kOld}}, {{kOld, {"", {{"mode", "600"}}}}}}, events};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=,mode:600!", "a=,mode:640!"));
    history.events.push_back(SyncFile{kOld, true});
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=,mode:600!", "a=,mode:640!"));
    history.events.push_back(SyncFile{kOld, false});
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=,mode:600", "a=,mode:640!"));
}

TEST(CrashStates, AnAttributeMayBeRemoved) {
    const History history{{{{"a", kOld}}, {{kOld, {"", {{"x", "1"}}}}}},
                          {SetAttribute{kOld, "x", std::nullopt}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=,x:1!", "a=!"));
}

TEST(CrashStates, AnAttributeMayBeAdded) {
    const History history{directory("a", ""), {SetAttribute{kOld, "x", "1"}}};
    EXPECT_THAT(statesOf(history), UnorderedElementsAre("a=!", "a=,x:1!"));
}

TEST(CrashStates, WhatProgramsSeeIsNeverLeftOut) {
    std::vector<Event> events{Create{"a", kNew, {}}};
    for (unsigned i = 0; i < 30; ++i)
        events.push_back(Write{kNew, 4 * i, "abcd"});
    const CrashStates states({{}, events}, {4, 100, NameOrder::OF_EACH});
    EXPECT_FALSE(states.complete());
    EXPECT_THAT(states.visible().files.at(kNew).bytes, SizeIs(120));
    const auto isIt = [&](const State& state) {
        return state.names.count("a") > 0 &&
               *state.names.at("a").file == states.visible().files.at(kNew);
    };
    EXPECT_TRUE(std::any_of(states.all().begin(), states.all().end(), isIt));
}

TEST(CrashStates, MoreBlocksOfAFileThanTheBoundAreNotAllCombined) {
    FileModel model({std::string(20, '.'), {}}, 4);
    model.write(0, std::string(20, 'x'));
    bool complete = true;
    EXPECT_THAT(model.variants(32, complete), SizeIs(32));
    EXPECT_TRUE(complete);
    const std::vector<File> some = model.variants(31, complete);
    EXPECT_FALSE(complete);
    EXPECT_EQ(some.back().bytes, std::string(20, 'x'));
    EXPECT_THAT(std::set<File>(some.begin(), some.end()), SizeIs(some.size()));
}

TEST(CrashStates, AFilesVariantsAreEachThereOnce) {
    FileModel model({"", {}}, 4);
    model.write(0, "a");
    model.truncate(0);
    model.write(0, "a");
    bool complete = true;
    std::vector<std::string> texts;
    for (const File& file : model.variants(100, complete))
        texts.push_back(file.bytes);
    EXPECT_THAT(texts, ElementsAre("", std::string(1, '\0'), "a"));
}

TEST(CrashStates, MoreFilesThanTheBoundAreNotAllCombined) {
    const History history{{{{"a", 1}, {"b", 2}}, {{1, {"........", {}}}, {2, {"........", {}}}}},
                          {Write{1, 0, "xxxxxxxx"}, Write{2, 0, "xxxxxxxx"}}};
    EXPECT_TRUE(CrashStates(history, {4, 16, NameOrder::OF_EACH}).complete());
    EXPECT_FALSE(CrashStates(history, {4, 15, NameOrder::OF_EACH}).complete());
}

TEST(CrashStates, MoreChangesOfNamesThanTheBoundAreNotAllCombined) {
    History history;
    for (unsigned i = 0; i < 5; ++i)
        history.events.push_back(Create{std::string(1, static_cast<char>('a' + i)), i, {}});
    const CrashStates all(history, {4, 32, NameOrder::OF_EACH});
    EXPECT_TRUE(all.complete());
    EXPECT_THAT(all.all(), SizeIs(32));
    const CrashStates bounded(history, {4, 31, NameOrder::OF_EACH});
    EXPECT_FALSE(bounded.complete());
    std::vector<std::string> texts;
    for (const State& state : bounded.all())
        texts.push_back(shown(state, 9));
    EXPECT_THAT(texts, AllOf(Contains(""), Contains("a= b= c= d= e="), Contains("a= b= c="),
                             Contains("a= b= d= e="), Not(Contains("a= e="))));
}

}  // namespace
