#pragma once

namespace schedules {

// What stands for an open file, or for a path, among the objects of a run. Never null.
const void* fileOf(int fd);
const void* pathOf(const char* path);

}  // namespace schedules
