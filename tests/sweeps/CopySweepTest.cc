#include <korvex/util/FileDescriptor.h>
#include <korvex/util/Pathname.h>

#include <gmock/gmock.h>
#include <sys/stat.h>

#include <cerrno>
#include <string>

#include "support/Sweep.h"
#include "support/TempDir.h"

namespace {

using testing::UnorderedElementsAre;
using testsupport::Call;
using testsupport::readFile;
using testsupport::sweep;
using testsupport::SweptFault;
using testsupport::TempDir;
using testsupport::writeFile;

TEST(CopySweep, ACopyIsWholeOrSaysWhyNotAndLeavesItsSourceAlone) {
    const TempDir dir;
    const Pathname from(dir.file("from"));
    const Pathname to(dir.file("to"));
    std::string content;
    for (unsigned i = 0; i < 20000 * testsupport::testScale(); ++i)
        content += static_cast<char>(i % 251);
    writeFile(from.c_str(), content);
    const auto swept =
        sweep("copy",
              {Call::open, Call::read, Call::write, Call::fstat, Call::stat, Call::close,
               Call::allocation},
              [&](SweptFault& fault) {
                  writeFile(to.c_str(), "old");
                  errno = 0;
                  fault.arm();
                  const bool copied = from.copyTo(to);
                  const int error = errno;
                  fault.disarm();
                  const std::string got = readFile(to.c_str());
                  if (copied) {
                      EXPECT_EQ(got, content);
                  } else {
                      EXPECT_EQ(error, fault.error());
                      EXPECT_TRUE(got == "old" || content.compare(0, got.size(), got) == 0);
                  }
                  EXPECT_EQ(readFile(from.c_str()), content);
                  EXPECT_TRUE(from.copyTo(to));
                  EXPECT_EQ(readFile(to.c_str()), content);
              });
    EXPECT_THAT(swept.fired, UnorderedElementsAre(Call::open, Call::read, Call::write, Call::fstat,
                                                  Call::stat, Call::close));
    EXPECT_GT(swept.points, 30U);
}

}  // namespace
