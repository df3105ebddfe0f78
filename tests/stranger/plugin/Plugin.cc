#include <korvex/framework/service/ComponentException.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

class Worker : public Thread {
  public:
    Worker() : Thread("worker") {}

  private:
    void main() override { Logger("plugin").info("hello from %s", currentName()); }
};

extern "C" [[gnu::visibility("default")]] int run() {
    const Thread mainThread;
    Worker worker;
    worker.go();
    worker.join();
    try {
        throw ComponentException("caught");
    } catch (const std::exception& e) {
        Logger("plugin").info(e);
    }
    return 42;
}
