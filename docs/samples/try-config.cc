// try-config FILE: reads a logging configuration and logs five messages, the same each time.
#include <korvex/util/Logger.h>

#include <cstdlib>

static Logger app("app"), net("net"), http("net.http"), audit("audit");

int main(int argc, char** argv) {
    if (argc != 2) return 2;
    Logger::initialize(Pathname(argv[1]), Pathname(std::getenv("KORVEX_HOME")));
    app.info("started");
    net.debug("12 bytes");
    net.warn("slow");
    http.info("GET /");
    audit.error("denied");
}
