# Shared compile settings and the small helpers every folder uses.

add_library(ac_options INTERFACE)
target_compile_options(ac_options INTERFACE -Wall -Wextra -Wpedantic)
if(AC_WERROR)
  target_compile_options(ac_options INTERFACE -Werror)
endif()
target_include_directories(ac_options INTERFACE ${CMAKE_SOURCE_DIR}/src)
target_compile_definitions(ac_options INTERFACE
  AC_VERSION="${PROJECT_VERSION}"
  AC_INSTALL_DATADIR="${CMAKE_INSTALL_DATADIR}")

if(AC_ASAN)
  # GCC's flow analysis sees the sanitizers' checks as uninitialised reads inside std::regex and
  # std::function; those warnings say nothing about our code in this build.
  target_compile_options(ac_options INTERFACE -fsanitize=address,undefined -fno-omit-frame-pointer
                         -fno-sanitize-recover=undefined -Wno-maybe-uninitialized)
  target_link_options(ac_options INTERFACE -fsanitize=address,undefined)
endif()
if(AC_FUZZ)
  # Every library carries coverage for libFuzzer; the fuzz executables add the driver.
  # Every finding is fatal, so libFuzzer saves the input and the run reports it: undefined
  # behaviour that only printed a line would be lost.
  target_compile_options(ac_options INTERFACE -fsanitize=fuzzer-no-link,address,undefined
                         -fno-omit-frame-pointer -fno-sanitize-recover=all)
  target_link_options(ac_options INTERFACE -fsanitize=address,undefined)
endif()
if(AC_TSAN)
  target_compile_options(ac_options INTERFACE -fsanitize=thread -fno-omit-frame-pointer)
  target_link_options(ac_options INTERFACE -fsanitize=thread)
endif()

# ac_add_library(NAME SOURCES... [LIBS ...]): a static library of one subsystem.
function(ac_add_library name)
  cmake_parse_arguments(ARG "" "" "SOURCES;LIBS" ${ARGN})
  add_library(${name} STATIC ${ARG_SOURCES})
  target_link_libraries(${name} PUBLIC ac_options ${ARG_LIBS})
  # Window-free libraries are collected for the fuzz targets and benchmarks.
  if(name MATCHES "_core$")
    set_property(GLOBAL APPEND PROPERTY AC_CORE_LIBRARIES ${name})
  endif()
endfunction()

# ac_add_test(NAME SOURCES... [LIBS ...] [ENV ...] [DISPLAY]): one GoogleTest executable of a
# subsystem. DISPLAY runs it under its own Xvfb.
function(ac_add_test name)
  cmake_parse_arguments(ARG "DISPLAY" "" "SOURCES;LIBS;ENV" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  target_link_libraries(${name} PRIVATE ac_options ${ARG_LIBS} GTest::gtest GTest::gtest_main)
  target_compile_definitions(${name} PRIVATE
    AC_SOURCE_DIR="${CMAKE_SOURCE_DIR}"
    AC_CORPUS_DIR="${CMAKE_SOURCE_DIR}/../shared/corpus"
    AC_BIN_DIR="${CMAKE_BINARY_DIR}/bin")
  if(ARG_DISPLAY)
    add_test(NAME ${name} COMMAND xvfb-run -a -s "-screen 0 1280x1024x24" $<TARGET_FILE:${name}>)
  else()
    add_test(NAME ${name} COMMAND ${name})
  endif()
  set(environment ${ARG_ENV})
  if(AC_TSAN)
    list(APPEND environment "TSAN_OPTIONS=suppressions=${CMAKE_SOURCE_DIR}/tests/tsan.supp")
  endif()
  if(AC_ASAN)
    list(APPEND environment
         "LSAN_OPTIONS=suppressions=${CMAKE_SOURCE_DIR}/tests/lsan.supp:print_suppressions=0")
  endif()
  set_tests_properties(${name} PROPERTIES TIMEOUT 600 ENVIRONMENT "${environment}")
endfunction()

# ac_add_fuzzer(NAME SOURCE [LIBS ...]): a libFuzzer target, built only with AC_FUZZ and clang.
function(ac_add_fuzzer name)
  if(NOT AC_FUZZ)
    return()
  endif()
  cmake_parse_arguments(ARG "" "" "SOURCES;LIBS" ${ARGN})
  add_executable(${name} ${ARG_SOURCES})
  target_compile_options(${name} PRIVATE -fsanitize=fuzzer)
  target_link_options(${name} PRIVATE -fsanitize=fuzzer)
  target_link_libraries(${name} PRIVATE ac_options ${ARG_LIBS})
endfunction()
