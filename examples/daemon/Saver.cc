#include "Saver.h"

#include <poll.h>

void Saver::main() {
    constexpr int kMinute = 60000;  // milliseconds
    struct pollfd stop {};
    stop.fd = _stop.fd();
    while (poll(&stop, 1, kMinute) == 0)
        _counters.save();
}
