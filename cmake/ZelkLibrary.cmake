# The shared library zelk::zelkclient, its static twin for the tests, and what is installed.
add_library(zelkclient SHARED)
add_library(zelk::zelkclient ALIAS zelkclient)
target_link_libraries(zelkclient
  PUBLIC android::binder android::utils android::log android::ui
  PRIVATE zelkclient_objects Threads::Threads zelk::options)
target_link_options(zelkclient PRIVATE LINKER:--version-script=${CMAKE_SOURCE_DIR}/cmake/zelkclient.map)
set_target_properties(zelkclient PROPERTIES LINK_DEPENDS ${CMAKE_SOURCE_DIR}/cmake/zelkclient.map)
target_include_directories(zelkclient PUBLIC
  $<BUILD_INTERFACE:${CMAKE_SOURCE_DIR}/include>
  $<INSTALL_INTERFACE:${CMAKE_INSTALL_INCLUDEDIR}>)

add_library(zelkclient_static STATIC EXCLUDE_FROM_ALL)
target_link_libraries(zelkclient_static PUBLIC zelkclient_objects zelk::options)
target_include_directories(zelkclient_static PUBLIC ${CMAKE_SOURCE_DIR})

install(DIRECTORY include/pemaro DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} FILES_MATCHING PATTERN "*.h")
install(TARGETS zelkclient EXPORT zelkclientTargets)
install(EXPORT zelkclientTargets NAMESPACE zelk:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/zelkclient)
install(FILES cmake/zelkclientConfig.cmake DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/zelkclient)
