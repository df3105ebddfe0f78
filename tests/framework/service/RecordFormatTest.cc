#include "framework/service/RecordFileManager/RecordFormat.h"

#include <gtest/gtest.h>

namespace {

TEST(RecordFormatTest, LengthsAreLittleEndianBytes) {
    unsigned char bytes[4];
    putLength(bytes, 0x04030201);
    EXPECT_EQ(bytes[0], 1);
    EXPECT_EQ(bytes[1], 2);
    EXPECT_EQ(bytes[2], 3);
    EXPECT_EQ(bytes[3], 4);
    EXPECT_EQ(getLength(bytes), 0x04030201U);
    putLength(bytes, 0xfffefdfcU);
    EXPECT_EQ(getLength(bytes), 0xfffefdfcU);
}

TEST(RecordFormatTest, AVersionKeyIsToldByItsBeginningInAnyCase) {
    EXPECT_TRUE(isVersionKey("_record-file-version"));
    EXPECT_TRUE(isVersionKey("_RECORD-file-Version.old"));
    EXPECT_FALSE(isVersionKey("_record-file-versio"));
    EXPECT_FALSE(isVersionKey("_record-file-versiom"));
    EXPECT_FALSE(isVersionKey("a key that is longer than the version's"));
}

}  // namespace
