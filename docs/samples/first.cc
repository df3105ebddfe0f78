#include <korvex/util/Logger.h>

int main() {
    Logger("first").info("hello, %s", "world");
}
