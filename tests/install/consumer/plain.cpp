// SPDX-License-Identifier: Apache-2.0
// The README's two lines of CMake and a status text: nothing here is of the platform.

#include <pemaro/Status.h>
#include <pemaro/Version.h>

#include <cstdio>

int main() {
    printf("zelkclient %s: %s\n", ZELK_VERSION, pemaro::errStr(pemaro::STATUS_NO_ERROR));
}
