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

# quorvan_room(NAME target [FOLDER folder] SOURCES ... [USES room ...] [PRIVATELY library ...])
#
# One static library. Its headers are reached as "folder/Header.h", and only by targets that link it: the include
# path holds nothing but a link to that folder. USES are the rooms that its headers or sources include; PRIVATELY
# names libraries that must not show through.
function(quorvan_room)
  cmake_parse_arguments(ROOM "" "NAME;FOLDER" "SOURCES;USES;PRIVATELY" ${ARGN})
  if(NOT ROOM_FOLDER)
    set(ROOM_FOLDER ${ROOM_NAME})
  endif()
  set(target quorvan_${ROOM_NAME})
  set(visible ${PROJECT_BINARY_DIR}/rooms/${ROOM_NAME})
  file(MAKE_DIRECTORY ${visible})
  file(CREATE_LINK ${PROJECT_SOURCE_DIR}/${ROOM_FOLDER} ${visible}/${ROOM_FOLDER} SYMBOLIC)
  add_library(${target} STATIC ${ROOM_SOURCES})
  target_include_directories(${target} PUBLIC ${visible})
  foreach(used IN LISTS ROOM_USES)
    target_link_libraries(${target} PUBLIC quorvan_${used})
  endforeach()
  target_link_libraries(${target} PRIVATE quorvan_flags ${ROOM_PRIVATELY})
endfunction()

# quorvan_test(NAME name SOURCES ... USES room ... [THREADS] [WINDOWS] [ALSO library ...])
#
# One GoogleTest program. THREADS marks it for the ThreadSanitizer run as well; WINDOWS gives it the toolkit's
# offscreen platform. Every TEST is a ctest entry and a process of its own.
function(quorvan_test)
  cmake_parse_arguments(TEST "THREADS;WINDOWS" "NAME" "SOURCES;USES;ALSO" ${ARGN})
  set(target test_${TEST_NAME})
  add_executable(${target} ${TEST_SOURCES})
  target_include_directories(${target} PRIVATE ${PROJECT_SOURCE_DIR}/tests)
  foreach(used IN LISTS TEST_USES)
    target_link_libraries(${target} PRIVATE quorvan_${used})
  endforeach()
  target_link_libraries(${target} PRIVATE quorvan_flags ${TEST_ALSO})
  # GoogleTest's checks hold an else of their own, which belongs to no if around them.
  target_compile_options(${target} PRIVATE -Wno-dangling-else)
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
  foreach(used IN LISTS FUZZ_USES)
    target_link_libraries(${target} PRIVATE quorvan_${used})
  endforeach()
  target_link_libraries(${target} PRIVATE quorvan_flags)
  if(QUORVAN_FUZZ)
    target_link_options(${target} PRIVATE -fsanitize=fuzzer)
  else()
    target_sources(${target} PRIVATE ${PROJECT_SOURCE_DIR}/fuzz/Replay.cpp)
    add_test(NAME fuzz.${FUZZ_NAME} COMMAND ${target} ${FUZZ_CORPUS})
    set_tests_properties(fuzz.${FUZZ_NAME} PROPERTIES TIMEOUT 300)
  endif()
endfunction()
