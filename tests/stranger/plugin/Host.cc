// Loads the plugin, and knows nothing of Korvex.
#include <dlfcn.h>

#include <cstdio>

int main(int, char** argv) {
    void* const plugin = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
    if (plugin == nullptr) return std::puts(dlerror());
    const auto run = reinterpret_cast<int (*)()>(dlsym(plugin, "run"));
    return run != nullptr && run() == 42 ? 0 : 1;
}
