#include "tools/RecordsTool.h"

namespace {

using namespace testsupport;
using testing::HasSubstr;

using StatsTest = RecordsToolTest;

TEST_F(StatsTest, SizesAreSummedUpAndDrawn) {
    writeFile(data, fileOf({{"k1", ""}, {"k2", "xyz"}, {"long key", "12345678"}}));
    const ChildResult result = run({"stats"});
    EXPECT_EQ(result.status, 0);
    EXPECT_EQ(result.out,
              "3 records\n"
              "\n"
              "                 bytes   smallest     median    largest\n"
              "keys                12          2          2          8\n"
              "values              11          0          3          8\n"
              "\n"
              "        bytes of a key    records\n"
              "                  2..3          2  ########################################\n"
              "                  4..7          0\n"
              "                 8..15          1  ####################\n"
              "\n"
              "      bytes of a value    records\n"
              "                     0          1  ########################################\n"
              "                     1          0\n"
              "                  2..3          1  ########################################\n"
              "                  4..7          0\n"
              "                 8..15          1  ########################################\n");
}

TEST_F(StatsTest, APrefixChoosesTheRecords) {
    writeFile(data, fileOf({{"a", "1"}, {"b1", "12"}, {"b2", "12"}}));
    EXPECT_THAT(run({"stats", "b"}).out, HasSubstr("2 records\n"));
    EXPECT_THAT(run({"stats", "b"}).out, HasSubstr("\nkeys                 4          2 "));
}

TEST_F(StatsTest, NothingThatMatchesIsStatusOne) {
    writeFile(data, fileOf({{"a", "1"}}));
    const ChildResult result = run({"stats", "b"});
    EXPECT_EQ(result.status, 1);
    EXPECT_EQ(result.out, "0 records\n");
    EXPECT_EQ(run({"stats", "a", "b"}).status, 2);
}

TEST_F(StatsTest, DamageIsTold) {
    writeFile(data, fileOf({{"a", "1"}}) + "\5");
    const ChildResult result = run({"stats"});
    EXPECT_EQ(result.status, 3);
    EXPECT_THAT(result.out, HasSubstr("1 record\n"));
    EXPECT_THAT(result.err, HasSubstr("damaged at offset 41"));
}

}  // namespace
