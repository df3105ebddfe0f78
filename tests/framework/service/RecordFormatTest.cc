#include "framework/service/RecordFileManager/RecordFormat.h"

#include <gtest/gtest.h>
#include <strings.h>

#include <clocale>
#include <cstdlib>
#include <string>

#include "support/Child.h"
#include "support/TempDir.h"

namespace {

using testsupport::runInChild;
using testsupport::TempDir;

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
    EXPECT_FALSE(isVersionKey("\x7frecord-file-version")) << "which differs from _ in one bit";
    EXPECT_FALSE(isVersionKey("_record\rfile-version"));
    EXPECT_FALSE(isVersionKey(""));
}

TEST(RecordFormatTest, AVersionKeyIsTheSameInTurkey) {
    const TempDir dir;
    const std::string locale = dir.file("tr_TR.ISO-8859-9");
    const std::string make = "localedef -i tr_TR -f ISO-8859-9 '" + locale + "' 2> /dev/null";
    if (std::system(make.c_str()) != 0) GTEST_SKIP() << "there is no localedef or no tr_TR";
    const auto result = runInChild([&] {
        setenv("LOCPATH", dir.path().c_str(), 1);
        if (std::setlocale(LC_ALL, "tr_TR.ISO-8859-9") == nullptr) return 1;
        if (strncasecmp("FILE", "file", 4) == 0) return 2;  // not as in Turkey
        return isVersionKey("_RECORD-FILE-VERSION") ? 0 : 3;
    });
    EXPECT_EQ(result.status, 0);
}

}  // namespace
