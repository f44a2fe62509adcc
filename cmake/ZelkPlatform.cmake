# Finds the Android platform: the imported targets android::log, android::utils, android::binder and
# android::ui; for tools and tests android::base as well. A build that already has them (an Android tree, another host) defines them before this
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

# libbase lies where liblog lies; the library itself does without.
if((ZELK_BUILD_TOOLS OR ZELK_BUILD_TESTS) AND NOT TARGET android::base)
  get_target_property(log_library android::log IMPORTED_LOCATION)
  cmake_path(GET log_library PARENT_PATH log_folder)
  find_library(ZELK_BASE_LIBRARY base HINTS "${log_folder}" REQUIRED)
  add_library(android::base SHARED IMPORTED)
  set_target_properties(android::base PROPERTIES IMPORTED_LOCATION "${ZELK_BASE_LIBRARY}")
  target_link_libraries(android::base INTERFACE android::log)
endif()
