// SPDX-License-Identifier: Apache-2.0
#pragma once

// Which sanitizer the tests are built with. They take some tens of times as long under one, so that what repeats
// the same thing, or makes it long, is cut short there: a build without sanitizers does all of it.

#if defined(__SANITIZE_ADDRESS__)
#define ZELK_ADDRESS_SANITIZER 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define ZELK_ADDRESS_SANITIZER 1
#endif
#endif

#if defined(__SANITIZE_THREAD__)
#define ZELK_THREAD_SANITIZER 1
#elif defined(__has_feature)
#if __has_feature(thread_sanitizer)
#define ZELK_THREAD_SANITIZER 1
#endif
#endif

namespace pemaro::test {

#if defined(ZELK_ADDRESS_SANITIZER) || defined(ZELK_THREAD_SANITIZER)
inline constexpr bool kSanitized = true;
#else
inline constexpr bool kSanitized = false;
#endif

}  // namespace pemaro::test
