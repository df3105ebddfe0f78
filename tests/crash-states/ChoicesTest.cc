#include "crash-states/Choices.h"

#include <gmock/gmock.h>

#include <set>

namespace {

using crashstates::Choice;
using crashstates::visitChoices;
using testing::Contains;
using testing::ElementsAre;
using testing::Not;
using testing::SizeIs;

struct Visited {
    std::vector<Choice> all;
    std::set<Choice> distinct;
    bool complete;
};

Visited visit(const std::vector<std::size_t>& counts, std::size_t limit) {
    Visited visited;
    visited.complete = visitChoices(counts, limit, [&](const Choice& choice) {
        visited.all.push_back(choice);
        visited.distinct.insert(choice);
    });
    return visited;
}

TEST(Choices, NothingToChooseIsOneChoice) {
    EXPECT_THAT(visit({}, 1).all, ElementsAre(Choice{}));
}

TEST(Choices, AllOfThemFromTheOldestToTheNewest) {
    const Visited visited = visit({2, 3}, 6);
    EXPECT_TRUE(visited.complete);
    EXPECT_THAT(visited.all, ElementsAre(Choice{0, 0}, Choice{0, 1}, Choice{0, 2}, Choice{1, 0},
                                         Choice{1, 1}, Choice{1, 2}));
}

TEST(Choices, OneMoreThanTheLimitIsTooMany) {
    EXPECT_FALSE(visit({2, 3}, 5).complete);
}

TEST(Choices, BeyondTheLimitThereIsOneLossAndTwoAndEachBeginning) {
    const Visited visited = visit({2, 2, 2, 2, 3}, 47);
    EXPECT_EQ(visited.all.front(), (Choice{0, 0, 0, 0, 0}));
    EXPECT_EQ(visited.all.back(), (Choice{1, 1, 1, 1, 2}));
    EXPECT_THAT(visited.distinct, Contains(Choice{1, 0, 1, 1, 2}));
    EXPECT_THAT(visited.distinct, Contains(Choice{1, 1, 1, 1, 1}));
    EXPECT_THAT(visited.distinct, Contains(Choice{0, 0, 1, 0, 0}));
    EXPECT_THAT(visited.distinct, Contains(Choice{0, 1, 1, 0, 2}));
    EXPECT_THAT(visited.distinct, Contains(Choice{1, 1, 0, 0, 0}));
    EXPECT_THAT(visited.distinct, Contains(Choice{0, 0, 0, 1, 2}));
    EXPECT_THAT(visited.distinct, Not(Contains(Choice{1, 0, 1, 0, 1})));
    // All newest, all oldest, 4 beginnings and 4 ends; 6 with one thing not the newest and 6 with
    // one not the oldest, of which 2 each are beginnings or ends; 10 with two losses, of which 2
    // are.
    EXPECT_THAT(visited.distinct, SizeIs(2 + 8 + 4 + 4 + 8));
}

TEST(Choices, ManyThingsDoNotOverflow) {
    EXPECT_FALSE(visit(std::vector<std::size_t>(100, 2), 1U << 20).complete);
}

}  // namespace
