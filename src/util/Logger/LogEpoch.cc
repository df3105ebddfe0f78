#include <korvex/util/Logger/LogEpoch.h>

#include "base/NeverDestroyed.h"
#include "util/Logger/Epoch.h"

inline namespace korvex {

FirstUse<CurrentTimeval>& epoch() {
    static NeverDestroyed<FirstUse<CurrentTimeval>> tv;
    return *tv;
}

const Timeval& epoch_timeval() {
    return epoch().get();
}

}  // namespace korvex
