#pragma once

#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <vector>

namespace testsupport {

// A directory of the test's own, removed with everything in it at the end.
class TempDir {
  public:
    TempDir();
    TempDir(const TempDir&) = delete;
    TempDir& operator=(const TempDir&) = delete;
    ~TempDir();

    const std::string& path() const { return _path; }
    // The path of `name` below the directory.
    std::string file(const std::string& name) const { return _path + "/" + name; }
    // The names in the directory, sorted.
    std::vector<std::string> names() const;

  private:
    std::string _path;
};

void writeFile(const std::string& path, const std::string& content);
// The whole file's bytes; empty when it cannot be read.
std::string readFile(const std::string& path);

}  // namespace testsupport
