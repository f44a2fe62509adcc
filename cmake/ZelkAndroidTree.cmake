# Android.bp and TEST_MAPPING as this build would have them: written into the build folder from the targets'
# sources, definitions, include folders and libraries. tests/android holds the tree's files against them.
#
# A library that another project brings is written by the name of its module in the Android tree; one that
# is not in this table is written as UNKNOWN, which the test refuses.
set(ZELK_BP_LIBRARIES
  "android::binder=" "android::utils=" "android::log=" "android::ui=" "Threads::Threads=" "zelk::options="
  "GTest::gtest=" "GTest::gtest_main=" "dl=" "zelkclient_objects="
  # Android 10 to 12 have no libtracefs: the tools are built without zelkctl's trace there.
  "zelkctl_trace="
  "android::base=shared_libs:libbase"
  "PNG::PNG=shared_libs:libpng"
  "ZLIB::ZLIB=shared_libs:libz"
  "PkgConfig::LIBEVDEV=shared_libs:libevdev"
  "fmt::fmt=static_libs:libfmtlib"
  "CLI11::CLI11=header_libs:libcli11_headers"
  "zelk::rapidjson=header_libs:librapidjson_headers"
  "GTest::gmock=static_libs:libgmock"
  "zelk::zelkclient=shared_libs:libzelkclient"
  "zelkclient_static=static_libs:libzelkclient_static"
  "zelk_fuzz_support=static_libs:libzelk_fuzz_support"
  "zelk::testkit=static_libs:libzelktestkit"
  "zelktestkit=static_libs:libzelktestkit")
# Tests that start a service manager, the programs or the completions of a desk, or read the documents; what counts
# costs there; the manual's programs, whose sources a build here takes out of the document; what needs libtracefs.
set(ZELK_BP_DESK_ONLY docs_protocols reference_tests report_page_test tools_tests zelk_values_plain values_plain_test
  values_plain_comparison_test values_allocations_test values_plain_numbers_test manual_by_name manual_watch
  zelkctl_trace trace_test)

set_property(GLOBAL PROPERTY ZELK_BP "")

function(zelk_bp_append text)
  set_property(GLOBAL APPEND_STRING PROPERTY ZELK_BP "${text}")
endfunction()

# zelk_bp_list(<name> <item>...): a list property, left out where it is empty.
function(zelk_bp_list name)
  if(ARGN)
    list(TRANSFORM ARGN REPLACE "(.+)" "\"\\1\"" OUTPUT_VARIABLE items)
    list(REMOVE_DUPLICATES items)
    list(JOIN items ", " items)
    zelk_bp_append("    ${name}: [${items}],\n")
  endif()
endfunction()

# zelk_bp_exceptions(<options>): an Android tree has none either, unless a module asks for them.
function(zelk_bp_exceptions options)
  if("-fexceptions" IN_LIST options)
    zelk_bp_list(cppflags -fexceptions)
  endif()
endfunction()

# zelk_bp_libraries(<module's type> <library>...): those of the table, and the archives of this tree. In an Android
# tree a module has what it names itself, nothing by way of another archive. So each names what those need that it
# names, and what is linked names all archives; an archive takes in no other's objects.
function(zelk_bp_libraries module)
  set(libraries ${ARGN})
  set(seen "")
  while(libraries)
    list(POP_FRONT libraries library)
    if(library MATCHES "^\\$<" OR library IN_LIST seen)
      continue()
    endif()
    list(APPEND seen ${library})
    set(found "static_libs:UNKNOWN_${library}")
    set(further "")
    if(TARGET ${library})
      get_target_property(type ${library} TYPE)
      if(type MATCHES "^(OBJECT|STATIC)_LIBRARY$")
        set(found "static_libs:lib${library}")
        get_target_property(further ${library} LINK_LIBRARIES)
      endif()
      if(type STREQUAL "OBJECT_LIBRARY" AND NOT module STREQUAL "cc_library_static")
        set(found "whole_static_libs:lib${library}")
      endif()
    endif()
    foreach(row IN LISTS ZELK_BP_LIBRARIES)
      if(row MATCHES "^${library}=(.*)$")
        set(found "${CMAKE_MATCH_1}")
      endif()
    endforeach()
    if(found MATCHES "^(.*):(.*)$")
      list(APPEND ${CMAKE_MATCH_1} ${CMAKE_MATCH_2})
      if(further)
        list(APPEND libraries ${further})
      endif()
    endif()
  endwhile()
  foreach(kind header_libs shared_libs static_libs whole_static_libs)
    zelk_bp_list(${kind} ${${kind}})
  endforeach()
endfunction()

# zelk_bp_paths(<variable> <folder> <path>...): the paths, of which some are relative to the folder, as they
# are seen from the tree's top.
function(zelk_bp_paths variable folder)
  set(paths "")
  foreach(path IN LISTS ARGN)
    if(NOT path MATCHES "^\\$<|-NOTFOUND$")
      cmake_path(ABSOLUTE_PATH path BASE_DIRECTORY ${folder} NORMALIZE)
      cmake_path(RELATIVE_PATH path BASE_DIRECTORY ${CMAKE_SOURCE_DIR})
      list(APPEND paths "${path}")
    endif()
  endforeach()
  set(${variable} "${paths}" PARENT_SCOPE)
endfunction()

# zelk_bp_target(<target> <module's type>): what its CMakeLists.txt tells.
function(zelk_bp_target target type)
  foreach(property SOURCES SOURCE_DIR COMPILE_DEFINITIONS INCLUDE_DIRECTORIES LINK_LIBRARIES COMPILE_OPTIONS)
    get_target_property(${property} ${target} ${property})
  endforeach()
  zelk_bp_paths(sources ${SOURCE_DIR} ${SOURCES})
  zelk_bp_list(srcs ${sources})
  set(flags "")
  if(COMPILE_DEFINITIONS)
    string(REPLACE "$<TARGET_FILE:zelkclient>" "libzelkclient.so" definitions "${COMPILE_DEFINITIONS}")
    string(REPLACE "\"" "\\\"" definitions "${definitions}")
    list(TRANSFORM definitions PREPEND -D OUTPUT_VARIABLE flags)
  endif()
  zelk_bp_list(cflags ${flags})
  zelk_bp_exceptions("${COMPILE_OPTIONS}")
  # What zelk_around_defaults has already.
  zelk_bp_paths(folders ${SOURCE_DIR} ${INCLUDE_DIRECTORIES})
  if(NOT target STREQUAL "zelkclient_objects")
    list(REMOVE_ITEM folders . include)
  endif()
  zelk_bp_list(local_include_dirs ${folders})
  # Objects that another target compiles.
  foreach(source IN LISTS SOURCES)
    if(source MATCHES "^\\$<TARGET_OBJECTS:(.*)>$")
      list(APPEND LINK_LIBRARIES ${CMAKE_MATCH_1})
    endif()
  endforeach()
  zelk_bp_libraries(${type} ${LINK_LIBRARIES})
endfunction()

# zelk_bp_module(<type> <name> <target or ""> <line>...): a module, with lines of its own behind the target's.
function(zelk_bp_module type name target)
  zelk_bp_append("\n${type} {\n    name: \"${name}\",\n")
  if(target)
    zelk_bp_target(${target} ${type})
  endif()
  foreach(line IN LISTS ARGN)
    zelk_bp_append("    ${line}\n")
  endforeach()
  zelk_bp_append("}\n")
endfunction()

# zelk_bp_targets(<variable> <folder>): all targets made in the folder and below.
function(zelk_bp_targets variable folder)
  get_property(targets DIRECTORY ${folder} PROPERTY BUILDSYSTEM_TARGETS)
  get_property(folders DIRECTORY ${folder} PROPERTY SUBDIRECTORIES)
  foreach(below IN LISTS folders)
    zelk_bp_targets(more ${below})
    list(APPEND targets ${more})
  endforeach()
  set(${variable} "${targets}" PARENT_SCOPE)
endfunction()

get_target_property(common_definitions zelk_options INTERFACE_COMPILE_DEFINITIONS)
get_target_property(platform_definitions android::binder INTERFACE_COMPILE_DEFINITIONS)
get_target_property(common_options zelk_options INTERFACE_COMPILE_OPTIONS)
set(common_flags ${common_options})
foreach(definition IN LISTS common_definitions platform_definitions)
  list(APPEND common_flags "-D${definition}")
endforeach()

zelk_bp_append([[
// The tree as a part of Android's. Sources, definitions, include folders and libraries are those of the CMake
// targets: after a change there, tests/android/android-bp --update writes this file anew.

cc_defaults {
    name: "zelk_defaults",
    cpp_std: "c++17",
    // Callers may derive from the stubs and need their type information.
    rtti: true,
    header_libs: ["libarect_headers", "libui_headers"],
    shared_libs: ["libbinder", "liblog", "libutils"],
]])
zelk_bp_list(cflags ${common_flags} -Werror)
zelk_bp_append([[
}

cc_defaults {
    name: "zelk_around_defaults",
    defaults: ["zelk_defaults"],
    local_include_dirs: [".", "include"],
}
]])

# ---- the library ---------------------------------------------------------------------------------------
zelk_bp_module(cc_defaults libzelkclient_defaults zelkclient_objects
  "defaults: [\"zelk_defaults\"]," "export_include_dirs: [\"include\"],"
  "cppflags: [\"-fvisibility=hidden\", \"-fvisibility-inlines-hidden\"],")
zelk_bp_module(cc_library_shared libzelkclient ""
  "defaults: [\"libzelkclient_defaults\"]," "version_script: \"cmake/zelkclient.map\",")
zelk_bp_module(cc_library_static libzelkclient_static "" "defaults: [\"libzelkclient_defaults\"],")
zelk_bp_module(cc_library_headers libzelkclient_headers "" "export_include_dirs: [\"include\"],")

# ---- what stands around it -----------------------------------------------------------------------------
zelk_bp_module(cc_library_static libzelktestkit_recorder zelktestkit_recorder "defaults: [\"zelk_around_defaults\"],"
  "export_include_dirs: [\"include\"],")
zelk_bp_module(cc_library_static libzelktestkit zelktestkit "defaults: [\"zelk_around_defaults\"],"
  "export_include_dirs: [\"include\"],")
foreach(folder values frames simulator tools examples tests)
  zelk_bp_targets(targets ${CMAKE_SOURCE_DIR}/${folder})
  list(SORT targets)
  foreach(target IN LISTS targets)
    get_target_property(type ${target} TYPE)
    get_target_property(source_dir ${target} SOURCE_DIR)
    if(source_dir MATCHES "/tests/(android|driver)" OR target IN_LIST ZELK_BP_DESK_ONLY)
      continue()
    elseif(type MATCHES "^(STATIC|OBJECT)_LIBRARY$")
      set(lines "defaults: [\"zelk_around_defaults\"],")
      zelk_bp_module(cc_library_static lib${target} ${target} ${lines})
    elseif(type STREQUAL "EXECUTABLE" AND folder STREQUAL "tests")
      zelk_bp_module(cc_test zelk_${target} ${target} "defaults: [\"zelk_around_defaults\"],"
        "test_suites: [\"device-tests\"],")
      list(APPEND android_tests zelk_${target})
    elseif(type STREQUAL "EXECUTABLE")
      set(lines "defaults: [\"zelk_around_defaults\"],")
      if(target STREQUAL "zelk-touchstack")
        list(APPEND lines "init_rc: [\"packaging/android/zelk-touchstack.rc\"],")
      endif()
      if(folder STREQUAL "examples")
        zelk_bp_module(cc_binary zelk_example_${target} ${target} ${lines})
      else()
        zelk_bp_module(cc_binary ${target} ${target} ${lines})
      endif()
    endif()
  endforeach()
endforeach()

# ---- the fuzzers, which only clang builds: read from their CMakeLists.txt ------------------------------
file(READ ${CMAKE_SOURCE_DIR}/fuzz/CMakeLists.txt fuzz_text)
# The variables in it.
string(REGEX MATCHALL "\nset\\([a-z]+ [^)]*\\)" calls "${fuzz_text}")
foreach(call IN LISTS calls)
  string(REGEX MATCH "\nset\\(([a-z]+) ([^)]*)\\)" call "${call}")
  string(CONFIGURE "${CMAKE_MATCH_2}" ${CMAKE_MATCH_1})
endforeach()

# zelk_bp_fuzz_module(<type> <name> SOURCES <source>... LIBS <target>...)
function(zelk_bp_fuzz_module type name)
  cmake_parse_arguments(PARSE_ARGV 2 ARG "" "" "SOURCES;LIBS")
  zelk_bp_append("\n${type} {\n    name: \"${name}\",\n    defaults: [\"zelk_around_defaults\"],\n")
  zelk_bp_paths(sources ${CMAKE_SOURCE_DIR}/fuzz ${ARG_SOURCES})
  zelk_bp_list(srcs ${sources})
  string(REGEX REPLACE "^zelk_" "" target "${name}")
  if(fuzz_text MATCHES "\nzelk_command_line_target\\(${target}\\)")
    zelk_bp_exceptions(-fexceptions)
  endif()
  zelk_bp_libraries(${type} ${ARG_LIBS})
endfunction()

string(REGEX MATCHALL "\n(zelk_fuzzer|add_library)\\([^)]*\\)" calls "${fuzz_text}")
foreach(call IN LISTS calls)
  string(CONFIGURE "${call}" call)
  string(REGEX REPLACE "[ \n()]+" ";" call "${call}")
  list(REMOVE_ITEM call "")
  list(POP_FRONT call command name)
  if(command STREQUAL "add_library")
    list(POP_FRONT call type)
    zelk_bp_fuzz_module(cc_library_static lib${name} SOURCES ${call} LIBS zelk_values_reference)
  else()
    cmake_parse_arguments(FUZZER "" "" "SOURCES;LIBS" ${call})
    zelk_bp_fuzz_module(cc_fuzz zelk_${name}_fuzzer SOURCES ${name}_fuzzer.cpp ${FUZZER_SOURCES}
      LIBS ${FUZZER_LIBS} zelk_fuzz_support zelk_values_reference zelkclient_static)
    zelk_bp_append("    dictionary: \"fuzz/${name}.dict\",\n    corpus: [\"fuzz/corpus/${name}/*\"],\n")
  endif()
  zelk_bp_append("}\n")
endforeach()

get_property(text GLOBAL PROPERTY ZELK_BP)
file(WRITE ${CMAKE_BINARY_DIR}/Android.bp "${text}")
list(SORT android_tests)
list(TRANSFORM android_tests REPLACE "(.+)" "    { \"name\": \"\\1\" }")
list(JOIN android_tests ",\n" android_tests)
file(WRITE ${CMAKE_BINARY_DIR}/TEST_MAPPING "{\n  \"presubmit\": [\n${android_tests}\n  ]\n}\n")
