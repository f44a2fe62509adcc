# zelk::zelkclient for other CMake projects: find_package(zelkclient), then link zelk::zelkclient.
# The Android platform comes through AndroidPlatform unless the targets android::* are there already.
include(CMakeFindDependencyMacro)
if(NOT TARGET android::binder)
  find_dependency(AndroidPlatform)
endif()
include("${CMAKE_CURRENT_LIST_DIR}/zelkclientTargets.cmake")
