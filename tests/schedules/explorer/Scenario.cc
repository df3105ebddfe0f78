#include "explorer/Scenario.h"

#include <fstream>
#include <iterator>
#include <sstream>

#include "explorer/Scheduler.h"

namespace schedules {

std::string Remains::file(const std::string& name) const {
    std::ifstream in(dir + "/" + name, std::ios::binary);
    return {std::istreambuf_iterator<char>(in), std::istreambuf_iterator<char>()};
}

std::vector<std::string> Remains::lines(const std::string& text) {
    std::vector<std::string> all;
    std::istringstream in(text);
    for (std::string line; std::getline(in, line);)
        all.push_back(line);
    return all;
}

std::vector<Scenario>& scenarios() {
    static std::vector<Scenario> all;
    return all;
}

Register::Register(std::initializer_list<Scenario> more) {
    scenarios().insert(scenarios().end(), more);
}

void require(bool condition, const char* what) {
    if (!condition) Scheduler::instance().fail("%s", what);
}

}  // namespace schedules
