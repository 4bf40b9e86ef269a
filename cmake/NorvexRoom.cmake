# What every target of the project is built with, and the functions that declare rooms, programs and tests.

set(NORVEX_COMPILE_OPTIONS -Wall -Wextra -Wpedantic -Wconversion -Wshadow)
if(NORVEX_WARNINGS_AS_ERRORS)
  list(APPEND NORVEX_COMPILE_OPTIONS -Werror)
endif()
if(NORVEX_SANITIZE)
  list(APPEND NORVEX_COMPILE_OPTIONS -fsanitize=${NORVEX_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
endif()

function(norvex_target_settings target)
  set_target_properties(${target} PROPERTIES CXX_STANDARD 20 CXX_STANDARD_REQUIRED ON CXX_EXTENSIONS OFF)
  target_compile_options(${target} PRIVATE ${NORVEX_COMPILE_OPTIONS})
  if(NORVEX_SANITIZE)
    target_link_options(${target} PRIVATE -fsanitize=${NORVEX_SANITIZE})
    if(NOT ${target} STREQUAL norvex_precompiled)
      target_precompile_headers(${target} REUSE_FROM norvex_precompiled)
    endif()
  endif()
endfunction()

# The builds for the sanitizers read the headers that most sources include once, and not once a source. All other builds
# go without, so that a source that lacks an include of its own fails there.
if(NORVEX_SANITIZE)
  find_package(GTest REQUIRED)
  file(CONFIGURE OUTPUT ${CMAKE_BINARY_DIR}/precompiled.cpp CONTENT "// Only the headers count.\n")
  add_library(norvex_precompiled OBJECT ${CMAKE_BINARY_DIR}/precompiled.cpp)
  norvex_target_settings(norvex_precompiled)
  target_link_libraries(norvex_precompiled PRIVATE GTest::gmock)
  target_precompile_headers(norvex_precompiled PRIVATE
    <algorithm> <array> <charconv> <chrono> <filesystem> <fstream> <functional> <map> <memory> <mutex> <optional> <sstream>
    <string> <string_view> <thread> <unordered_map> <variant> <vector> <gmock/gmock.h> <gtest/gtest.h>)
endif()

# norvex_room(NAME SOURCES a.cpp ... ROOMS platform ... LIBRARIES PkgConfig::X ...)
#
# Declares the library norvex_NAME. Its headers are included as "folder/Header.h". They are reached through a folder
# in the build tree that holds links to the headers of this room alone, so that a room sees the headers of the rooms
# it links and no others.
function(norvex_room name)
  cmake_parse_arguments(ROOM "" "" "SOURCES;ROOMS;LIBRARIES" ${ARGN})
  add_library(norvex_${name} STATIC ${ROOM_SOURCES})
  norvex_target_settings(norvex_${name})

  set(include_root ${CMAKE_BINARY_DIR}/include/${name})
  file(RELATIVE_PATH folder ${CMAKE_SOURCE_DIR} ${CMAKE_CURRENT_SOURCE_DIR})
  file(REMOVE_RECURSE ${include_root})
  file(MAKE_DIRECTORY ${include_root}/${folder})
  file(GLOB headers CONFIGURE_DEPENDS RELATIVE ${CMAKE_CURRENT_SOURCE_DIR} *.h *.def)
  foreach(header IN LISTS headers)
    file(CREATE_LINK ${CMAKE_CURRENT_SOURCE_DIR}/${header} ${include_root}/${folder}/${header} SYMBOLIC)
  endforeach()
  target_include_directories(norvex_${name} PUBLIC ${include_root})

  foreach(room IN LISTS ROOM_ROOMS)
    target_link_libraries(norvex_${name} PUBLIC norvex_${room})
  endforeach()
  target_link_libraries(norvex_${name} PRIVATE ${ROOM_LIBRARIES})
endfunction()

# All threaded test programs, and so all that a build for the thread sanitizer needs.
add_custom_target(norvex_threaded_tests)

# norvex_golden_files(NAME)
#
# Gives the test program NAME the expected outputs in the folder "golden" beside it (tests/golden/GoldenFile.h).
function(norvex_golden_files name)
  target_sources(${name} PRIVATE ${CMAKE_SOURCE_DIR}/tests/golden/GoldenFile.cpp)
  target_include_directories(${name} PRIVATE ${CMAKE_SOURCE_DIR}/tests/golden)
  target_compile_definitions(${name} PRIVATE NORVEX_GOLDEN_FOLDER="${CMAKE_CURRENT_SOURCE_DIR}/golden")
endfunction()

# norvex_test(NAME SOURCES a.cpp ... LIBRARIES norvex_x ... [THREADED])
#
# Declares the test program NAME and every test in it. THREADED gives its tests the label "threaded": they run
# under the thread sanitizer too.
function(norvex_test name)
  cmake_parse_arguments(TEST "THREADED" "" "SOURCES;LIBRARIES" ${ARGN})
  add_executable(${name} ${TEST_SOURCES})
  norvex_target_settings(${name})
  target_compile_definitions(${name} PRIVATE NORVEX_SOURCE_DIR="${CMAKE_SOURCE_DIR}")
  target_link_libraries(${name} PRIVATE ${TEST_LIBRARIES} GTest::gmock GTest::gtest_main)
  set(labels "")
  if(TEST_THREADED)
    set(labels PROPERTIES LABELS threaded)
    add_dependencies(norvex_threaded_tests ${name})
  endif()
  gtest_discover_tests(${name} TEST_PREFIX "${name}." DISCOVERY_TIMEOUT 60 ${labels})
endfunction()

# norvex_session_test(NAME SOURCES a.cpp ... SETUP setup.sh LIBRARIES norvex_x ... [ROOT])
#
# Declares the test program NAME, which runs as an unprivileged user inside a session of its own: a service manager,
# a bus and a journal that are thrown away afterwards. SETUP is run as root before the session begins. The program is
# run from a copy: the user of the session may not be allowed to read the build folder. With ROOT the session is root's,
# for what nobody else may do to its services. Where no session can be made
# the test is skipped; its output says why.
function(norvex_session_test name)
  cmake_parse_arguments(TEST "ROOT" "SETUP" "SOURCES;LIBRARIES" ${ARGN})
  add_executable(${name} ${TEST_SOURCES})
  norvex_target_settings(${name})
  target_link_libraries(${name} PRIVATE ${TEST_LIBRARIES} GTest::gmock GTest::gtest_main)
  set(setup "set -e; install -m 755 '$<TARGET_FILE:${name}>' /run/${name}; . '${CMAKE_CURRENT_SOURCE_DIR}/${TEST_SETUP}'")
  set(user "")
  if(TEST_ROOT)
    set(user -r)
  endif()
  add_test(NAME ${name}
    COMMAND ${CMAKE_SOURCE_DIR}/tests/system/with-user-session ${user} -s "${setup}" /run/${name}
    WORKING_DIRECTORY /)
  set_tests_properties(${name} PROPERTIES SKIP_RETURN_CODE 77 LABELS session)
endfunction()

# norvex_session_cases(PREFIX SCRIPT ARGUMENT...)
#
# Declares a test for each case that `SCRIPT --list` names ("Claim=case", one a line): SCRIPT case ARGUMENT... Each makes
# a session of its own; where none can be made the test is skipped, and its output says why. PREFIX_TESTS is set to
# their names.
function(norvex_session_cases prefix script)
  set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${script})
  execute_process(
    COMMAND ${CMAKE_COMMAND} -E env NORVEX_TIMER=${NORVEX_TIMER} ${Python3_EXECUTABLE} -B ${script} --list
    OUTPUT_VARIABLE cases OUTPUT_STRIP_TRAILING_WHITESPACE COMMAND_ERROR_IS_FATAL ANY)
  string(REPLACE "\n" ";" cases "${cases}")
  set(tests "")
  foreach(case IN LISTS cases)
    string(REGEX MATCH "^(.*)=(.*)$" ignored "${case}")
    set(test ${prefix}.${CMAKE_MATCH_1})
    add_test(NAME ${test} COMMAND ${Python3_EXECUTABLE} -B ${script} ${CMAKE_MATCH_2} ${ARGN})
    set_tests_properties(${test} PROPERTIES
      SKIP_RETURN_CODE 77 LABELS session ENVIRONMENT NORVEX_TIMER=${NORVEX_TIMER})
    list(APPEND tests ${test})
  endforeach()
  set(${prefix}_TESTS ${tests} PARENT_SCOPE)
endfunction()
