// SPDX-License-Identifier: Apache-2.0
#include "Check.h"

int main() {
    useValues();
    useServices();
    useClients();
    puts("the installed library is complete");
}
