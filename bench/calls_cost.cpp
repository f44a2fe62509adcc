// SPDX-License-Identifier: Apache-2.0

// Makes one call once, after a first time that binds the symbols and fills the allocator's caches.

#include <cstdio>
#include <cstring>

#include "bench/Calls.h"
#include "bench/Measured.h"

int main(int argc, char** argv) {
    if (argc == 3) {
        for (const pemaro::bench::CallPair& pair : pemaro::bench::calls()) {
            if (pair.name != argv[2]) continue;
            const pemaro::bench::Call& call = strcmp(argv[1], "zelk") == 0 ? pair.zelk : pair.bare;
            call();
            zelk_measured(call);
            return 0;
        }
    }
    fprintf(stderr, "usage: calls_cost zelk|bare OPERATION\n");
    return 2;
}
