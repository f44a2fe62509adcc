# The shared library zelk::zelkclient, and its static twin for the tests.
add_library(zelkclient SHARED)
add_library(zelk::zelkclient ALIAS zelkclient)
target_link_libraries(zelkclient
  PUBLIC android::binder android::utils android::log android::ui
  PRIVATE zelkclient_objects Threads::Threads zelk::options)
target_link_options(zelkclient PRIVATE LINKER:--version-script=${CMAKE_SOURCE_DIR}/cmake/zelkclient.map)
set_target_properties(zelkclient PROPERTIES
  LINK_DEPENDS ${CMAKE_SOURCE_DIR}/cmake/zelkclient.map
  INSTALL_RPATH "${ZELK_LIBRARY_RPATH}")
target_compile_features(zelkclient PUBLIC cxx_std_17)
target_include_directories(zelkclient PUBLIC
  $<BUILD_INTERFACE:${CMAKE_SOURCE_DIR}/include>
  $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)

add_library(zelkclient_static STATIC EXCLUDE_FROM_ALL)
target_link_libraries(zelkclient_static PUBLIC zelkclient_objects zelk::options)
target_include_directories(zelkclient_static PUBLIC ${CMAKE_SOURCE_DIR})
