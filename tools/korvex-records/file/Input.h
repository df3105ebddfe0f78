#pragma once

#include <cstdint>
#include <cstdio>
#include <memory>
#include <string>

// All of a file, or of standard input where the name is "-". Throws Failure IO_ERROR.
std::string readInput(const std::string& name);

// Lines of a file, or of standard input where the name is "-". They can be read again from the
// start: what is not a regular file is copied into an unnamed one first. All members throw Failure
// IO_ERROR.
class LineInput {
  public:
    explicit LineInput(const std::string& name);
    // An open file from its present position on.
    explicit LineInput(std::FILE* file);
    LineInput(const LineInput&) = delete;
    LineInput& operator=(const LineInput&) = delete;
    ~LineInput();

    void rewind();
    // The next line without its newline; false at the end.
    bool next(std::string& line);
    // The number of the line that was read last, counted from 1; one more at the end.
    std::uint64_t number() const { return _number; }
    // Whether a newline ended it.
    bool wasWhole() const { return _wasWhole; }

  private:
    struct Close {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    const std::string _name;
    std::unique_ptr<std::FILE, Close> _file;
    off_t _start = 0;
    std::uint64_t _size = 0;
    std::uint64_t _read = 0;
    std::uint64_t _number = 0;
    bool _wasWhole = true;
    char* _line = nullptr;  // getline(3)'s
    std::size_t _capacity = 0;
};
