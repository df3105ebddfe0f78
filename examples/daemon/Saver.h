#pragma once

#include <korvex/util/Thread.h>

#include "Counters.h"
#include "Stop.h"

// The worker that saves the counts once a minute.
class Saver : public Thread {
  public:
    Saver(Counters& counters, const Stop& stop)
        : Thread("saver"), _counters(counters), _stop(stop) {}

  private:
    void main() override;

    Counters& _counters;
    const Stop& _stop;
};
