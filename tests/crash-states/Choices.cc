#include "crash-states/Choices.h"

namespace crashstates {

namespace {

bool areMoreThan(std::size_t limit, const std::vector<std::size_t>& counts) {
    std::size_t product = 1;
    for (const std::size_t count : counts) {
        if (product > limit / count) return true;
        product *= count;
    }
    return false;
}

void visitAll(const std::vector<std::size_t>& counts,
              const std::function<void(const Choice&)>& visit) {
    Choice choice(counts.size(), 0);
    for (std::size_t i = counts.size();;) {
        visit(choice);
        for (i = counts.size(); i > 0 && choice[i - 1] + 1 == counts[i - 1]; --i)
            choice[i - 1] = 0;
        if (i == 0) return;
        ++choice[i - 1];
    }
}

void visitSome(const Choice& newest, const std::function<void(const Choice&)>& visit) {
    const std::size_t n = newest.size();
    const Choice oldest(n, 0);
    for (std::size_t cut = 0; cut <= n; ++cut) {
        Choice front = oldest;
        Choice back = newest;
        for (std::size_t i = 0; i < cut; ++i) {
            front[i] = newest[i];
            back[i] = 0;
        }
        visit(front);
        visit(back);
    }
    for (std::size_t i = 0; i < n; ++i) {
        for (std::size_t version = 0; version <= newest[i]; ++version) {
            for (Choice choice : {oldest, newest}) {
                choice[i] = version;
                visit(choice);
            }
        }
        for (std::size_t j = 0; j < i; ++j) {
            Choice choice = newest;
            choice[i] = choice[j] = 0;
            visit(choice);
        }
    }
    visit(newest);
}

}  // namespace

bool visitChoices(const std::vector<std::size_t>& counts, std::size_t limit,
                  const std::function<void(const Choice&)>& visit) {
    if (!areMoreThan(limit, counts)) {
        visitAll(counts, visit);
        return true;
    }
    Choice newest;
    for (const std::size_t count : counts)
        newest.push_back(count - 1);
    visitSome(newest, visit);
    return false;
}

}  // namespace crashstates
