# Where installed programs and libraries find each other, wherever the installed folder is moved to. The
# platform that `./dev setup` built goes along, in a folder of its own below the library's: Debian has no
# libbinder that could be found elsewhere. A platform that came by other ways is not ours to install.
option(ZELK_INSTALL_PLATFORM "Install the built platform beside the library" ${ZELK_PLATFORM_IS_BUILT})
set(ZELK_INSTALL_PLATFORM_DIR ${CMAKE_INSTALL_LIBDIR}/zelkclient/platform)

# zelk_install_rpath(<variable> <folder>): the RUNPATH of what is installed into the folder. The platform's
# own libraries stand in it although the library's RUNPATH holds them as well: a program refers to them
# itself, and a RUNPATH counts only for the file that it stands in.
function(zelk_install_rpath variable folder)
  file(RELATIVE_PATH to_libraries /${folder} /${CMAKE_INSTALL_LIBDIR})
  if(NOT to_libraries STREQUAL "")
    list(APPEND rpath "$ORIGIN/${to_libraries}")
    string(APPEND to_libraries "/")
  endif()
  if(ZELK_INSTALL_PLATFORM)
    list(APPEND rpath "$ORIGIN/${to_libraries}zelkclient/platform/lib")
  endif()
  foreach(name utils log)
    get_target_property(file android::${name} IMPORTED_LOCATION)
    # What lies in the built platform is installed with it.
    cmake_path(IS_PREFIX ZELK_PLATFORM_DIR "${file}" in_platform)
    if(file AND NOT in_platform)
      cmake_path(GET file PARENT_PATH folder)
      list(APPEND rpath "${folder}")
    endif()
  endforeach()
  list(REMOVE_DUPLICATES rpath)
  set(${variable} "${rpath}" PARENT_SCOPE)
endfunction()

zelk_install_rpath(ZELK_LIBRARY_RPATH ${CMAKE_INSTALL_LIBDIR})
zelk_install_rpath(CMAKE_INSTALL_RPATH ${CMAKE_INSTALL_BINDIR})
# By its number a debugger finds the symbols that are installed in a file of their own.
add_link_options(LINKER:--build-id=sha1)
