#include <korvex/util/Logger/LogEpoch.h>

#include "base/NeverDestroyed.h"

inline namespace korvex {

const Timeval& epoch_timeval() {
    static NeverDestroyed<CurrentTimeval> tv;
    return *tv;
}

}  // namespace korvex
