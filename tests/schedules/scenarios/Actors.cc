#include <korvex/util/Thread.h>

#include <atomic>
#include <string>
#include <vector>

#include "explorer/Scenario.h"
#include "scenarios/Parallel.h"

// The queue of actors, with every order of submitting, running and waiting.

namespace schedules {

namespace {

class Note : public InThreadActor {
  public:
    Note(std::string& notes, char letter) : _notes(notes), _letter(letter) {}
    void callback() override { _notes += _letter; }

  private:
    std::string& _notes;
    const char _letter;
};

void submitAndRun() {
    InThreadActorQueue queue;
    std::string notes;
    Note a(notes, 'a');
    Note b(notes, 'b');
    Note c(notes, 'c');
    Parallel threads{[&] {
                         queue.submit(a);
                         queue.submit(b);
                     },
                     [&] { queue.submit(c); }};
    std::size_t ran = 0;
    while (ran < 3) {
        queue.waitForWork(1);
        ran += queue.runQueued();
    }
    threads.join();
    require(ran == 3 && notes.size() == 3, "not every actor has run just once");
    require(notes.find('a') < notes.find('b'), "a thread's actors have run in another order");
}

void submitAndWait() {
    InThreadActorQueue queue;
    const auto submit = [&](char letter) {
        std::string notes;
        Note note(notes, letter);
        queue.submitAndWait(note);
        require(!notes.empty(), "submitAndWait() has returned too early");
        require(notes.size() == 1, "an actor has run twice");
    };
    Parallel threads{[&] { submit('a'); }, [&] { submit('b'); }};
    std::size_t ran = 0;
    while (ran < 2) {
        queue.waitForWork(1);
        ran += queue.runQueued();
    }
    threads.join();
    require(ran == 2, "not every actor has run just once");
}

// One that deletes itself is not looked at after it has run.
class Passing : public InThreadActor {
  public:
    explicit Passing(std::atomic<int>& ran) : _ran(ran) {}
    void callback() override {
        ++_ran;
        delete this;
    }

  private:
    std::atomic<int>& _ran;
};

void deleteThemselves() {
    InThreadActorQueue queue;
    std::atomic<int> ran{0};
    Parallel threads{[&] { queue.submit(*new Passing(ran)); },
                     [&] { queue.submit(*new Passing(ran)); }};
    while (ran < 2) {
        queue.waitForWork(1);
        queue.runQueued();
    }
    threads.join();
    require(queue.runQueued() == 0, "an actor has run twice");
}

// A wait ends with work, or by its time without.
void waitForWork() {
    InThreadActorQueue queue;
    std::string notes;
    Note a(notes, 'a');
    Parallel threads{[&] { queue.submit(a); }};
    const bool there = queue.waitForWork(1);
    const std::size_t ran = queue.runQueued();
    require(!there || ran == 1, "waitForWork() has told of work that is not there");
    threads.join();
    require(ran + queue.runQueued() == 1, "the actor has not run just once");
}

const Register registered{
    {"actors-submit-and-run", &submitAndRun},
    {"actors-submit-and-wait", &submitAndWait},
    {"actors-delete-themselves", &deleteThemselves},
    {"actors-wait-for-work", &waitForWork},
};

}  // namespace

}  // namespace schedules
