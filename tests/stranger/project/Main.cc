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

int main(int argc, char** argv) {
    LoaderInfo::getInstance()->init(argc, argv);
    LoaderInfo::getInstance()->setCommonComponentNode(xml::node("stranger", "content"));
    const Thread mainThread;
    Logger::initialize();
    Logger logger("stranger");
    logger.info("hello from %s", Thread::currentName());
    other::Logger().warn(LoaderInfo::getInstance()->getCommonComponentNode().get_name());
    PersistentHashData data;
    RecordFileManager::instance()->get("key", data);
    return data._pData == nullptr ? 0 : 1;
}
