# How rooms, tests and benchmarks are declared, so that each directory says only what it holds.

add_library(quorvan_flags INTERFACE)
target_compile_options(quorvan_flags INTERFACE
  -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Werror
  # Clang, which builds the fuzzers, counts it among the conversions; g++ does not.
  $<$<CXX_COMPILER_ID:Clang>:-Wno-sign-conversion>)
if(QUORVAN_SANITIZE STREQUAL "address")
  set(QUORVAN_SANITIZE_FLAGS -fsanitize=address,undefined -fno-sanitize-recover=all -fno-omit-frame-pointer)
elseif(QUORVAN_SANITIZE STREQUAL "thread")
  set(QUORVAN_SANITIZE_FLAGS -fsanitize=thread -fno-omit-frame-pointer)
elseif(NOT QUORVAN_SANITIZE STREQUAL "")
  message(FATAL_ERROR "QUORVAN_SANITIZE is '${QUORVAN_SANITIZE}'; it can be empty, address or thread")
endif()
if(QUORVAN_FUZZ)
  list(APPEND QUORVAN_SANITIZE_FLAGS -fsanitize=fuzzer-no-link)
endif()
target_compile_options(quorvan_flags INTERFACE ${QUORVAN_SANITIZE_FLAGS})
target_link_options(quorvan_flags INTERFACE ${QUORVAN_SANITIZE_FLAGS})

# quorvan_target(variable room): the name of the library of the room that stands in that folder.
function(quorvan_target variable room)
  string(REPLACE "/" "_" name ${room})
  set(${variable} quorvan_${name} PARENT_SCOPE)
endfunction()

# quorvan_link_rooms(target visibility room ...)
function(quorvan_link_rooms target visibility)
  foreach(room IN LISTS ARGN)
    quorvan_target(used ${room})
    target_link_libraries(${target} ${visibility} ${used})
  endforeach()
endfunction()

# quorvan_room(SOURCES ... [USES room ...] [PRIVATELY library ...])
#
# The one static library of this folder. Its headers are reached as "folder/Header.h", and only by targets that link
# it: the include path holds links to these headers and to nothing else, those in private/ for the room itself alone.
# USES are the rooms, named by their folders, that its headers or sources include; PRIVATELY names libraries that must
# not show through.
function(quorvan_room)
  cmake_parse_arguments(ROOM "" "" "SOURCES;USES;PRIVATELY" ${ARGN})
  file(RELATIVE_PATH folder ${PROJECT_SOURCE_DIR} ${CMAKE_CURRENT_SOURCE_DIR})
  quorvan_target(target ${folder})
  add_library(${target} STATIC ${ROOM_SOURCES})
  set(visible ${PROJECT_BINARY_DIR}/rooms/${target})
  file(REMOVE_RECURSE ${visible} ${visible}.private)
  file(GLOB headers CONFIGURE_DEPENDS RELATIVE ${CMAKE_CURRENT_SOURCE_DIR} *.h private/*.h)
  foreach(header IN LISTS headers)
    if(header MATCHES "^private/")
      set(link ${visible}.private/${folder}/${header})
    else()
      set(link ${visible}/${folder}/${header})
    endif()
    cmake_path(GET link PARENT_PATH parent)
    file(MAKE_DIRECTORY ${parent})
    file(CREATE_LINK ${CMAKE_CURRENT_SOURCE_DIR}/${header} ${link} SYMBOLIC)
  endforeach()
  target_include_directories(${target} PUBLIC ${visible} PRIVATE ${visible}.private)
  quorvan_link_rooms(${target} PUBLIC ${ROOM_USES})
  target_link_libraries(${target} PRIVATE quorvan_flags ${ROOM_PRIVATELY})
endfunction()

# What the ThreadSanitizer run builds.
add_custom_target(thread_tests)

# quorvan_test(NAME name SOURCES ... USES room ... [THREADS] [WINDOWS] [ALSO library ...])
#
# One GoogleTest program. THREADS marks it for the ThreadSanitizer run as well; WINDOWS gives it the toolkit's
# offscreen platform. Every TEST is a ctest entry and a process of its own.
function(quorvan_test)
  cmake_parse_arguments(TEST "THREADS;WINDOWS" "NAME" "SOURCES;USES;ALSO" ${ARGN})
  set(target test_${TEST_NAME})
  add_executable(${target} ${TEST_SOURCES})
  target_include_directories(${target} PRIVATE ${PROJECT_SOURCE_DIR}/tests)
  quorvan_link_rooms(${target} PRIVATE ${TEST_USES})
  target_link_libraries(${target} PRIVATE quorvan_flags ${TEST_ALSO})
  # GoogleTest's checks hold an else of their own, which belongs to no if around them. And what a test does itself takes
  # no time, but optimising it does.
  target_compile_options(${target} PRIVATE -Wno-dangling-else -O0)
  set(environment
    "TSAN_OPTIONS=halt_on_error=1:suppressions=${PROJECT_SOURCE_DIR}/tests/tsan.supp"
    "LSAN_OPTIONS=suppressions=${PROJECT_SOURCE_DIR}/tests/lsan.supp"
    "UBSAN_OPTIONS=print_stacktrace=1")
  if(TEST_WINDOWS)
    list(APPEND environment "QT_QPA_PLATFORM=offscreen")
    target_link_libraries(${target} PRIVATE Qt6::Widgets Qt6::Test GTest::gtest)
  else()
    target_link_libraries(${target} PRIVATE GTest::gtest GTest::gtest_main)
  endif()
  set(properties "TIMEOUT 300")
  if(TEST_THREADS)
    string(APPEND properties " LABELS threads")
    add_dependencies(thread_tests ${target})
  endif()
  gtest_discover_tests(${target} TEST_PREFIX ${TEST_NAME}. TEST_LIST ${target}_TESTS DISCOVERY_TIMEOUT 120)
  # Discovery takes properties apart at every semicolon, and the environment is a list: it is set when ctest reads
  # the tests.
  set(script ${CMAKE_CURRENT_BINARY_DIR}/${target}_properties.cmake)
  file(CONFIGURE OUTPUT ${script} @ONLY CONTENT
    "if(@target@_TESTS)\n  set_tests_properties(\${@target@_TESTS} PROPERTIES @properties@ ENVIRONMENT \"@environment@\")\nendif()\n")
  set_property(DIRECTORY APPEND PROPERTY TEST_INCLUDE_FILES ${script})
endfunction()

# quorvan_fuzz(NAME name SOURCES ... USES room ... CORPUS folder)
#
# One fuzz target: LLVMFuzzerTestOneInput in SOURCES. With QUORVAN_FUZZ it is a libFuzzer program (Clang only).
# Otherwise it replays the files of the corpus as a test, so that what a fuzzer once found stays mended.
function(quorvan_fuzz)
  cmake_parse_arguments(FUZZ "" "NAME;CORPUS" "SOURCES;USES" ${ARGN})
  set(target fuzz_${FUZZ_NAME})
  add_executable(${target} ${FUZZ_SOURCES})
  quorvan_link_rooms(${target} PRIVATE ${FUZZ_USES})
  target_link_libraries(${target} PRIVATE quorvan_flags)
  if(QUORVAN_FUZZ)
    target_link_options(${target} PRIVATE -fsanitize=fuzzer)
  else()
    target_sources(${target} PRIVATE ${PROJECT_SOURCE_DIR}/fuzz/Replay.cpp)
    add_test(NAME fuzz.${FUZZ_NAME} COMMAND ${target} ${FUZZ_CORPUS})
    set_tests_properties(fuzz.${FUZZ_NAME} PROPERTIES TIMEOUT 300)
  endif()
endfunction()
