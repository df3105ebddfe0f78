#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;

class DiffTest : public RecordsToolTest {
  protected:
    const std::string other = dir.file("other");
};

TEST_F(DiffTest, ItTellsWhatWouldMakeTheOneTheOther) {
    writeFile(data, fileOf({{"a", "1"}, {"b", "2"}, {"d", "4"}, {"e\n", "5"}}));
    writeFile(other, fileOf({{"", "0"}, {"b", "2"}, {"c", "3"}, {"d", "44"}, {"f", "6"}}));
    const ChildResult result = run({"diff", other});
    EXPECT_EQ(result.out, "+ \n- a\n+ c\n~ d\n- e\\0a\n+ f\n");
    EXPECT_EQ(result.status, 1);
}

TEST_F(DiffTest, TheLongFormHasSizesAndTheFirstByteThatDiffers) {
    writeFile(data, fileOf({{"a", "1"}, {"b", "12345"}, {"c", "same"}}));
    writeFile(other, fileOf({{"b", "123"}, {"c", "sane"}, {"d", ""}}));
    EXPECT_EQ(run({"diff", "--long", other}).out,
              "-          1          -  a\n"
              "~          5          3  b  from byte 3\n"
              "~          4          4  c  from byte 2\n"
              "+          -          0  d\n");
}

TEST_F(DiffTest, TheSameRecordsAreNoDifferenceWhateverTheirOrder) {
    writeFile(data, fileOf({{"a", "1"}, {"b", "2"}}));
    writeFile(other, recordBytes("b", "2") + recordBytes("a", "1"));
    const ChildResult result = run({"diff", other});
    EXPECT_EQ(result.out, "");
    EXPECT_EQ(result.status, 0);
}

TEST_F(DiffTest, NothingIsChangedAndNothingIsLeftBesideTheOtherFile) {
    const std::string content = fileOf({{"a", "1"}});
    writeFile(data, content);
    writeFile(other, fileOf({{"b", "1"}}) + "\5");
    writeFile(other + ".copy", content);
    EXPECT_EQ(run({"diff", other}).status, 3);
    EXPECT_EQ(stored(), content);
    EXPECT_EQ(readFile(other), fileOf({{"b", "1"}}) + "\5");
    EXPECT_NE(access((other + ".lock").c_str(), F_OK), 0);
}

TEST_F(DiffTest, DamageOfEitherFileIsToldAndWhatCanBeReadIsCompared) {
    writeFile(data, fileOf({{"a", "1"}}));
    writeFile(other, fileOf({{"b", "1"}}) + "\5");
    const ChildResult theirs = run({"diff", other});
    EXPECT_EQ(theirs.status, 3);
    EXPECT_EQ(theirs.out, "- a\n+ b\n");
    EXPECT_THAT(theirs.err, HasSubstr("korvex-records: " + other +
                                      ": damaged at offset 41: key length cut short\n"));
    const ChildResult ours = run({"-f", other, "diff", data});
    EXPECT_EQ(ours.status, 3);
    EXPECT_EQ(ours.out, "+ a\n- b\n");
}

TEST_F(DiffTest, AMissingFileIsNoEmptyOne) {
    const ChildResult result = run({"diff", other});
    EXPECT_EQ(result.status, 4);
    EXPECT_THAT(result.err, HasSubstr("korvex-records: " + other + ": no such file\n"));
    EXPECT_EQ(run({"diff", dir.path()}).status, 4);
    EXPECT_EQ(run({"diff"}).status, 2);
    EXPECT_EQ(run({"diff", other, other}).status, 2);
}

TEST_F(DiffTest, LostOutputIsNoticed) {
    writeFile(other, fileOf({{"b", "1"}}));
    const auto full = [] { dup2(open("/dev/full", O_WRONLY), 1); };
    EXPECT_EQ(run({"diff", other}, "", full).status, 4);
}

}  // namespace
