// SPDX-License-Identifier: Apache-2.0
#pragma once

#ifdef __GLIBC__

#include <gtest/gtest.h>
#include <pthread.h>

namespace pemaro::test {

/// While it lives no thread can be made: its stack would be one that no process has room for.
class NoThreads {
  public:
    NoThreads() {
        pthread_getattr_default_np(&mUsual);
        pthread_attr_t huge;
        pthread_attr_init(&huge);
        pthread_attr_setstacksize(&huge, size_t{1} << 46);
        EXPECT_EQ(0, pthread_setattr_default_np(&huge));
        pthread_attr_destroy(&huge);
    }
    ~NoThreads() {
        EXPECT_EQ(0, pthread_setattr_default_np(&mUsual));
        pthread_attr_destroy(&mUsual);
    }

  private:
    pthread_attr_t mUsual;
};

}  // namespace pemaro::test

#endif
