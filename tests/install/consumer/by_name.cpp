// SPDX-License-Identifier: Apache-2.0
// by_name LIBRARY: loads the library and makes a facade through its factory.

#include <dlfcn.h>

#include <cstdio>

using Factory = int (*)(int classID, int version, void** instance);

int main(int, char** argv) {
    void* const library = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
    void* const symbol = library == nullptr ? nullptr : dlsym(library, "VEXPemaroCreateInstance");
    if (symbol == nullptr) {
        fprintf(stderr, "by_name: %s\n", dlerror());
        return 1;
    }
    void* facade = nullptr;
    const int status = reinterpret_cast<Factory>(symbol)(2048, 2048 << 16, &facade);
    printf("status %d, %s\n", status, facade == nullptr ? "no facade" : "a facade");
    return status == 0 && facade != nullptr ? 0 : 1;
}
