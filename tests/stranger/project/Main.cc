#include <korvex/framework/service/RecordFileManager.h>
#include <korvex/util/LoaderInfo.h>
#include <korvex/util/Logger.h>
#include <korvex/util/Thread.h>

#include <cstdio>

// Not our Logger: another library's, whose name must not clash at link time.
namespace other {
class Logger {
  public:
    void warn(const char* text);
};
void Logger::warn(const char* text) {
    std::puts(text);
}
}  // namespace other

class Worker : public Thread {
  public:
    Worker() : Thread("worker") {}

  private:
    void main() override { Logger("stranger").info("hello from %s", currentName()); }
};

int main(int argc, char** argv) {
    LoaderInfo::getInstance()->init(argc, argv);
    LoaderInfo::getInstance()->setCommonComponentNode(xml::node("stranger", "content"));
    const Thread mainThread;
    Logger::initialize();
    Logger logger("stranger");
    logger.info("hello from %s", Thread::currentName());
    Worker worker;
    worker.go();
    worker.join();
    try {
        const Thread anotherMainThread;
    } catch (const PthreadException& error) {  // thrown on the other side
        std::puts(error.what());
    }
    other::Logger().warn(LoaderInfo::getInstance()->getCommonComponentNode().get_name());
    PersistentHashData data;
    RecordFileManager::instance()->get("key", data);
    return data._pData == nullptr ? 0 : 1;
}
