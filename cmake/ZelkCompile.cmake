# zelk_compile_options: what every source of this tree is compiled with. zelk::warnings is for our own
# targets only and is never exported.
find_package(Threads REQUIRED)

# ccache takes precompiled headers only where it is told to overlook things, and then gains nothing by them.
if(CMAKE_CXX_COMPILER_LAUNCHER MATCHES "ccache")
  set(CMAKE_DISABLE_PRECOMPILE_HEADERS ON)
endif()

# Most of a source's compile time is spent on the headers that it shares with its neighbours. The library is compiled
# source by source all the same, as on Android: so its code is the same in every build.
if(ZELK_BATCHES)
  set(CMAKE_UNITY_BUILD ON)
  # About headers; what a batch includes are sources.
  add_compile_options($<$<COMPILE_LANG_AND_ID:CXX,GNU>:-Wno-subobject-linkage>)
endif()

# Of all but the library a debugger knows the lines alone: variables and types are a third of the time that an optimised
# source takes to compile. In a debug build it knows everything.
add_compile_options($<$<CONFIG:RelWithDebInfo>:-g1>)

# The device's platform code is built without exceptions. So is this tree, but for the targets that ask for them, as a
# library that they use throws: a sixth of what a test compiles to, unoptimised, would be ways out of its blocks.
add_compile_options($<$<COMPILE_LANGUAGE:CXX>:-fno-exceptions>)

add_library(zelk_options INTERFACE)
add_library(zelk::options ALIAS zelk_options)
target_compile_options(zelk_options INTERFACE -Wall -Wextra -fno-strict-aliasing)
# The platform keeps its index checks (LOG_FATAL_IF) in every build type only with LOG_NDEBUG 0; they are
# part of the library's behaviour.
target_compile_definitions(zelk_options INTERFACE LOG_NDEBUG=0)

# Arm's char is unsigned, a desk's is not. The build for AddressSanitizer has a device's, everywhere: so the whole
# native test run, the tests' own sources included, sees both, at no cost.
if(ZELK_SANITIZE MATCHES "address")
  add_compile_options(-funsigned-char)
endif()

if(ZELK_SANITIZE)
  target_compile_options(zelk_options INTERFACE -fsanitize=${ZELK_SANITIZE} -fno-omit-frame-pointer)
  target_link_options(zelk_options INTERFACE -fsanitize=${ZELK_SANITIZE})
  # A container's index beside its elements is seen where it stays within the memory, too.
  target_compile_definitions(zelk_options INTERFACE _GLIBCXX_ASSERTIONS)
  if(ZELK_SANITIZE MATCHES "undefined")
    # vptr checks need RTTI of the platform's classes, which its libraries do not promise.
    target_compile_options(zelk_options INTERFACE -fno-sanitize-recover=all -fno-sanitize=vptr)
    if(CMAKE_CXX_COMPILER_ID MATCHES "Clang")
      target_compile_options(zelk_options INTERFACE
        -fsanitize-ignorelist=${CMAKE_SOURCE_DIR}/cmake/sanitizer-ignore.txt)
    endif()
  endif()
endif()
if(ZELK_COVERAGE)
  target_compile_options(zelk_options INTERFACE --coverage -fprofile-update=atomic)
  target_link_options(zelk_options INTERFACE --coverage)
endif()

# zelk_optimize(<target>): what the tests run most. Of a build with sanitizers nothing else is optimised, for to compile
# it takes longer than it saves.
function(zelk_optimize target)
  if(ZELK_SANITIZE)
    target_compile_options(${target} PRIVATE -O1)
  endif()
endfunction()

# The library's sources, compiled once: the shared library is linked from them, and so are the test
# programs, which reach internals that the shared library does not export.
add_library(zelkclient_objects OBJECT)
target_include_directories(zelkclient_objects
  PUBLIC ${CMAKE_SOURCE_DIR}/include
  PRIVATE ${CMAKE_SOURCE_DIR})
target_link_libraries(zelkclient_objects
  PUBLIC android::binder android::utils android::log android::ui Threads::Threads
  PRIVATE zelk::options)
# RTTI stays on: a caller that derives from a stub may need its type information.
set_target_properties(zelkclient_objects PROPERTIES
  POSITION_INDEPENDENT_CODE ON
  CXX_VISIBILITY_PRESET hidden
  VISIBILITY_INLINES_HIDDEN ON
  UNITY_BUILD OFF)
zelk_optimize(zelkclient_objects)
# To read these takes nearly half of the time of most. That each source names what it uses is seen where there are no
# batches, and by the tests that have libc++ or another processor.
if(ZELK_BATCHES)
  target_precompile_headers(zelkclient_objects PRIVATE
    <algorithm> <atomic> <functional> <map> <memory> <mutex> <string> <string_view> <type_traits> <utility> <vector>)
endif()
if(NOT ZELK_SANITIZE)
  target_compile_options(zelkclient_objects PRIVATE $<$<CONFIG:RelWithDebInfo>:-g2>)
endif()
