#pragma once

#include <cstddef>
#include <functional>
#include <vector>

namespace crashstates {

// Which version of each thing is on the disk: 0 is its oldest.
using Choice = std::vector<std::size_t>;

// Visits the ways to choose one of counts[0] versions, one of counts[1] and so on; the first is all
// oldest, the last all newest. All ways where they are `limit` at most: true. Where they are more,
// false, and those which a defect is likeliest to need, some of them twice:
//   - all up to some place newest and all behind it oldest, and the other way round;
//   - all newest but for one thing, which has any version; all oldest but for one;
//   - all newest but for two things, which are oldest.
bool visitChoices(const std::vector<std::size_t>& counts, std::size_t limit,
                  const std::function<void(const Choice&)>& visit);

}  // namespace crashstates
