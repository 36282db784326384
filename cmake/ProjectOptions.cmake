# Build options shared by every target of the project.
#
#   ORV_SANITIZE=address   AddressSanitizer + UndefinedBehaviorSanitizer
#   ORV_SANITIZE=thread    ThreadSanitizer
#   ORV_FUZZ=ON            libFuzzer targets (needs clang)
#   ORV_BENCH=ON           Google Benchmark programs under bench/
#   ORV_TESTS=ON           tests/, bench/ and fuzz/ (the Debian packages build without them)

set(ORV_SANITIZE "" CACHE STRING "Sanitizer build: empty, 'address' or 'thread'")
set_property(CACHE ORV_SANITIZE PROPERTY STRINGS "" address thread)
option(ORV_FUZZ "Build the libFuzzer targets (clang only)" OFF)
option(ORV_BENCH "Build the benchmarks" ON)
option(ORV_TESTS "Build the tests, benchmarks and fuzz targets (off: only what is installed)" ON)
option(ORV_WERROR "Warnings of the project's own code are errors" ON)

if(ORV_SANITIZE STREQUAL "address")
  add_compile_options(-fsanitize=address,undefined -fno-omit-frame-pointer -fno-sanitize-recover=undefined)
  add_link_options(-fsanitize=address,undefined)
elseif(ORV_SANITIZE STREQUAL "thread")
  add_compile_options(-fsanitize=thread -fno-omit-frame-pointer)
  add_link_options(-fsanitize=thread)
  # Boost.Asio wraps each handler call in a standalone fence, which ThreadSanitizer does not
  # model (GCC refuses it under -Werror=tsan). Handlers pass between threads through the
  # scheduler's and the reactor's mutexes, which it does see, so the fence adds nothing here.
  # Every target that includes Boost.Asio compiles with these definitions.
  set(ORV_ASIO_DEFINITIONS BOOST_ASIO_DISABLE_FENCED_BLOCK)
elseif(NOT ORV_SANITIZE STREQUAL "")
  message(FATAL_ERROR "ORV_SANITIZE must be empty, 'address' or 'thread', not '${ORV_SANITIZE}'")
endif()

# A fuzz build instruments the libraries under test (fuzz/CMakeLists.txt); every program
# linking them then needs the coverage callbacks, which this link option brings.
if(ORV_FUZZ AND CMAKE_CXX_COMPILER_ID MATCHES "Clang")
  add_link_options(-fsanitize=fuzzer-no-link)
endif()

# Warnings as errors on the project's own code. Call it for every target the
# project defines; third-party headers are included as SYSTEM and stay quiet.
function(orv_project_target target)
  target_compile_options(${target} PRIVATE
    -Wall -Wextra $<$<BOOL:${ORV_WERROR}>:-Werror> -Wshadow -Wformat=2 -Wundef
    $<$<COMPILE_LANGUAGE:CXX>:-Wnon-virtual-dtor -Woverloaded-virtual>)
  # Sanitizer instrumentation makes GCC's flow analysis report uninitialised
  # values inside the standard library (std::regex, std::function) that are not.
  if(ORV_SANITIZE AND CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    target_compile_options(${target} PRIVATE -Wno-maybe-uninitialized)
  endif()
endfunction()

# A provider library a broker loads: built into the provider folder, with no
# undefined symbol left, and only its <Provider>_Create_<Kind>MI factories
# global (a broker finds the providers by those names alone); every other
# symbol is local, whatever the static libraries linked in would export.
function(orv_provider_library target)
  set(exports ${CMAKE_CURRENT_BINARY_DIR}/${target}.map)
  file(WRITE ${exports} "{\n  global:\n    *_Create_*MI;\n  local:\n    *;\n};\n")
  target_link_options(${target} PRIVATE -Wl,-z,defs -Wl,--version-script=${exports})
  set_target_properties(${target} PROPERTIES
    LINK_DEPENDS ${exports}
    LIBRARY_OUTPUT_DIRECTORY ${ORV_PROVIDER_DIR})
endfunction()

# A GoogleTest suite registered with ctest. Usage:
#   orv_add_gtest(name SOURCES a.cpp b.cpp LIBS lib1 lib2 [PROPERTIES LABELS x ...])
# PROPERTIES are set on every discovered test.
function(orv_add_gtest name)
  cmake_parse_arguments(ARG "" "" "SOURCES;LIBS;PROPERTIES" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  orv_project_target(${name})
  target_link_libraries(${name} PRIVATE ${ARG_LIBS} GTest::gtest GTest::gtest_main GTest::gmock Threads::Threads)
  # The suite runs (and is listed) through env(1) so that it sees where the build
  # and the sources are. A list-valued ENVIRONMENT test property would lose all but
  # its first entry on its way through gtest_discover_tests.
  set_target_properties(${name} PROPERTIES CROSSCOMPILING_EMULATOR
    "/usr/bin/env;ORV_BUILD_DIR=${CMAKE_BINARY_DIR};ORV_SOURCE_DIR=${CMAKE_SOURCE_DIR}")
  if(ARG_PROPERTIES)
    gtest_discover_tests(${name} DISCOVERY_TIMEOUT 60 PROPERTIES ${ARG_PROPERTIES})
  else()
    gtest_discover_tests(${name} DISCOVERY_TIMEOUT 60)
  endif()
endfunction()

# Adds every sub-folder of the current folder that has a CMakeLists.txt, in name order.
function(orv_add_subfolders)
  file(GLOB children RELATIVE ${CMAKE_CURRENT_SOURCE_DIR} ${CMAKE_CURRENT_SOURCE_DIR}/*)
  list(SORT children)
  foreach(child ${children})
    if(IS_DIRECTORY ${CMAKE_CURRENT_SOURCE_DIR}/${child} AND EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/${child}/CMakeLists.txt)
      add_subdirectory(${child})
    endif()
  endforeach()
endfunction()

# Only what a library exports on purpose is visible: the provider library's
# factories. Everything else, including the static libraries linked into it, is hidden.
set(CMAKE_C_VISIBILITY_PRESET hidden)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
