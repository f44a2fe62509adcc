# Finds the Android platform: the imported targets android::log, android::utils, android::binder and
# android::ui. A build that already has them (an Android tree, another host) defines them before this
# file is read; else they come from the platform that `./dev setup` built into ZELK_PLATFORM_DIR.
set(ZELK_PLATFORM_DIR "${CMAKE_SOURCE_DIR}/build/platform" CACHE PATH
    "Where the built platform libraries are installed")

set(ZELK_PLATFORM_IS_BUILT OFF)
if(NOT TARGET android::binder)
  if(NOT EXISTS "${ZELK_PLATFORM_DIR}/lib/cmake/AndroidPlatform/AndroidPlatformConfig.cmake")
    message(FATAL_ERROR
            "no built Android platform in ${ZELK_PLATFORM_DIR}: run ./dev setup first, or set "
            "ZELK_PLATFORM_DIR, or define the targets android::log, android::utils, android::binder "
            "and android::ui")
  endif()
  find_package(AndroidPlatform REQUIRED NO_DEFAULT_PATH PATHS "${ZELK_PLATFORM_DIR}")
  set(ZELK_PLATFORM_IS_BUILT ON)
endif()
