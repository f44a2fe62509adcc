// SPDX-License-Identifier: Apache-2.0

// What a process pays that loads the library by name: each time in a child that has neither the library nor
// the platform's libraries yet. start/dlopen is the loading alone, start/facade goes on to a facade.

#include <benchmark/benchmark.h>
#include <dlfcn.h>
#include <sys/wait.h>
#include <unistd.h>

#include <chrono>
#include <cstdlib>

namespace {

using Clock = std::chrono::steady_clock;

/// Seconds that a child takes for it, or a negative number when it could not.
double loadInChild(bool makeFacade) {
    int ends[2];
    if (pipe(ends) != 0) return -1;
    const pid_t child = fork();
    if (child == 0) {
        const Clock::time_point start = Clock::now();
        void* const library = dlopen(ZELK_LIBRARY, RTLD_NOW);
        bool done = library != nullptr;
        if (done && makeFacade) {
            using Create = int (*)(int, int, void**);
            const auto create = reinterpret_cast<Create>(dlsym(library, "VEXPemaroCreateInstance"));
            void* facade = nullptr;
            done = create != nullptr && create(2048, 0x8000000, &facade) == 0;
        }
        double seconds = std::chrono::duration<double>(Clock::now() - start).count();
        if (!done) seconds = -1;
        const bool told = write(ends[1], &seconds, sizeof(seconds)) == sizeof(seconds);
        _exit(told ? 0 : 1);
    }
    close(ends[1]);
    double seconds = -1;
    if (read(ends[0], &seconds, sizeof(seconds)) != sizeof(seconds)) seconds = -1;
    close(ends[0]);
    waitpid(child, nullptr, 0);
    return seconds;
}

void load(benchmark::State& state, bool makeFacade) {
    for (auto _ : state) {
        const double seconds = loadInChild(makeFacade);
        if (seconds < 0) {
            state.SkipWithError("the library could not be loaded");
            break;
        }
        state.SetIterationTime(seconds);
    }
}
BENCHMARK_CAPTURE(load, dlopen, false)->Name("start/dlopen")->UseManualTime();
BENCHMARK_CAPTURE(load, facade, true)->Name("start/facade")->UseManualTime();

}  // namespace
