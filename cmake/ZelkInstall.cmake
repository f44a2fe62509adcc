# What is installed, in components: Library, Platform, Development, Tools, Documentation. An installation of
# all of them at once, `cmake --install`, strips the library and the programs and puts their symbols into
# files of their own; who installs by component, as a packager does, gets them whole.
include(CMakePackageConfigHelpers)
set(ZELK_PACKAGE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/zelkclient)

install(TARGETS zelkclient EXPORT zelkclientTargets COMPONENT Library)
install(TARGETS zelktestkit zelktestkit_recorder EXPORT zelkclientTargets COMPONENT Development)
if(ZELK_BUILD_TOOLS)
  install(TARGETS zelkctl zelk-touchstack COMPONENT Tools)
endif()
# Where bash, zsh and man look for them.
get_property(references GLOBAL PROPERTY ZELK_REFERENCE_FILES)
if(references)
  foreach(program zelkctl zelk-touchstack)
    install(FILES ${ZELK_REFERENCE_DIR}/${program}.bash
      DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME ${program} COMPONENT Tools)
    install(FILES ${ZELK_REFERENCE_DIR}/_${program}
      DESTINATION ${CMAKE_INSTALL_DATADIR}/zsh/site-functions COMPONENT Tools)
    install(FILES ${ZELK_REFERENCE_DIR}/${program}.1
      DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT Tools)
  endforeach()
endif()

install(DIRECTORY include/pemaro DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT Development
  FILES_MATCHING PATTERN "*.h")
install(EXPORT zelkclientTargets NAMESPACE zelk:: DESTINATION ${ZELK_PACKAGE_DIR} COMPONENT Development)
configure_package_config_file(cmake/zelkclientConfig.cmake.in zelkclientConfig.cmake
  INSTALL_DESTINATION ${ZELK_PACKAGE_DIR} PATH_VARS ZELK_INSTALL_PLATFORM_DIR
  NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(zelkclientConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/zelkclientConfig.cmake
  ${CMAKE_CURRENT_BINARY_DIR}/zelkclientConfigVersion.cmake
  DESTINATION ${ZELK_PACKAGE_DIR} COMPONENT Development)

# ---- the platform --------------------------------------------------------------------------------------
if(ZELK_INSTALL_PLATFORM)
  install(DIRECTORY ${ZELK_PLATFORM_DIR}/lib ${ZELK_PLATFORM_DIR}/bin
    DESTINATION ${ZELK_INSTALL_PLATFORM_DIR} USE_SOURCE_PERMISSIONS COMPONENT Platform
    PATTERN cmake EXCLUDE)
  install(DIRECTORY ${ZELK_PLATFORM_DIR}/include
    DESTINATION ${ZELK_INSTALL_PLATFORM_DIR} COMPONENT Development)
  install(DIRECTORY ${ZELK_PLATFORM_DIR}/lib/cmake
    DESTINATION ${ZELK_INSTALL_PLATFORM_DIR}/lib COMPONENT Development)
endif()

# ---- zelkclient.pc -------------------------------------------------------------------------------------
# The platform's folders, as compilers and linkers are told about them.
set(PC_CFLAGS "")
set(PC_LIBS "")
set(platform_prefix "${ZELK_PLATFORM_DIR}")
foreach(name binder utils log ui)
  get_target_property(folders android::${name} INTERFACE_INCLUDE_DIRECTORIES)
  get_target_property(definitions android::${name} INTERFACE_COMPILE_DEFINITIONS)
  get_target_property(file android::${name} IMPORTED_LOCATION)
  foreach(folder IN LISTS folders)
    string(REPLACE "${platform_prefix}" "\${platform}" folder "${folder}")
    if(folder)
      list(APPEND PC_CFLAGS "-isystem ${folder}")
    endif()
  endforeach()
  if(definitions)
    list(TRANSFORM definitions PREPEND -D)
    list(APPEND PC_CFLAGS ${definitions})
  endif()
  if(file)
    cmake_path(GET file PARENT_PATH folder)
    string(REPLACE "${platform_prefix}" "\${platform}" folder "${folder}")
    list(APPEND PC_LIBS "-L${folder}" "-Wl,-rpath,${folder}" "-l${name}")
  endif()
endforeach()
list(REMOVE_DUPLICATES PC_CFLAGS)
list(REMOVE_DUPLICATES PC_LIBS)
list(JOIN PC_CFLAGS " " PC_CFLAGS)
list(JOIN PC_LIBS " " PC_LIBS)
cmake_path(RELATIVE_PATH CMAKE_INSTALL_PREFIX BASE_DIRECTORY ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig
  OUTPUT_VARIABLE PC_PREFIX)
configure_file(cmake/zelkclient.pc.in zelkclient.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/zelkclient.pc
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT Development)

# ---- documents and examples ----------------------------------------------------------------------------
install(FILES README.md CHANGELOG.md CONTRIBUTING.md SECURITY.md LICENSE
  DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT Documentation)
install(DIRECTORY docs DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT Documentation
  FILES_MATCHING PATTERN "*.md" PATTERN "*.svg" PATTERN doxygen EXCLUDE)
install(DIRECTORY examples DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT Documentation)

install(FILES docs/zelkclient.7 DESTINATION ${CMAKE_INSTALL_MANDIR}/man7 COMPONENT Development)

# ---- symbols in files of their own ---------------------------------------------------------------------
set(ZELK_STRIPPED ${CMAKE_INSTALL_LIBDIR}/$<TARGET_FILE_NAME:zelkclient>)
if(ZELK_BUILD_TOOLS)
  foreach(program zelkctl zelk-touchstack)
    list(APPEND ZELK_STRIPPED ${CMAKE_INSTALL_BINDIR}/$<TARGET_FILE_NAME:${program}>)
  endforeach()
endif()
if(ZELK_INSTALL_PLATFORM)
  foreach(name lib/libbinder.so lib/libutils.so.0 bin/servicemanager bin/service)
    list(APPEND ZELK_STRIPPED ${ZELK_INSTALL_PLATFORM_DIR}/${name})
  endforeach()
endif()
find_program(READELF NAMES ${CMAKE_READELF} readelf REQUIRED)
configure_file(cmake/ZelkStrip.cmake.in ZelkStrip.cmake.configured @ONLY)
file(GENERATE OUTPUT ${CMAKE_CURRENT_BINARY_DIR}/ZelkStrip.cmake
  INPUT ${CMAKE_CURRENT_BINARY_DIR}/ZelkStrip.cmake.configured)
install(CODE "
  if(NOT CMAKE_INSTALL_COMPONENT)
    include(\"${CMAKE_CURRENT_BINARY_DIR}/ZelkStrip.cmake\")
  endif()")
