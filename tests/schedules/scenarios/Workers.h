#pragma once

#include <korvex/util/Thread.h>

#include <functional>
#include <utility>

namespace schedules {

// A Thread of the library that runs what it is given.
class Worker : public Thread {
  public:
    Worker(const char* name, std::function<void()> body) : Thread(name), _body(std::move(body)) {}

  private:
    void main() override { _body(); }

    std::function<void()> _body;
};

}  // namespace schedules
