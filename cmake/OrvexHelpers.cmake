# Shared build helpers: warnings, test executables for both builds, fuzz targets.

# Warnings every target of ours gets (third-party code such as GoogleTest does not).
function(orvex_warnings target)
  target_compile_options(${target} PRIVATE -Wall -Wextra -Wshadow -Wno-unused-parameter)
  if(ORVEX_WERROR)
    target_compile_options(${target} PRIVATE -Werror)
  endif()
endfunction()

# The cross build compiles GoogleTest from the sources Debian ships in /usr/src/googletest.
macro(orvex_add_windows_gtest)
  set(gtest_force_shared_crt OFF CACHE BOOL "" FORCE)
  set(INSTALL_GTEST OFF CACHE BOOL "" FORCE)
  set(BUILD_GMOCK ON CACHE BOOL "" FORCE)
  add_subdirectory(/usr/src/googletest ${CMAKE_BINARY_DIR}/googletest EXCLUDE_FROM_ALL)
  if(NOT TARGET GTest::gtest_main)
    add_library(GTest::gtest ALIAS gtest)
    add_library(GTest::gtest_main ALIAS gtest_main)
    add_library(GTest::gmock ALIAS gmock)
  endif()
endmacro()

# orvex_gtest(NAME SOURCES a.cpp b.cpp LIBS lib1 lib2 [WORKING_DIRECTORY dir])
# A GoogleTest executable. Natively each case becomes its own ctest test; in the Windows build the
# executable runs once under Wine (tools/wine-run), which keeps Wine's start-up cost to one per file.
function(orvex_gtest name)
  cmake_parse_arguments(T "" "WORKING_DIRECTORY" "SOURCES;LIBS" ${ARGN})
  add_executable(${name} ${T_SOURCES})
  target_link_libraries(${name} PRIVATE ${T_LIBS} GTest::gtest_main GTest::gmock)
  orvex_warnings(${name})
  if(NOT T_WORKING_DIRECTORY)
    set(T_WORKING_DIRECTORY ${CMAKE_CURRENT_BINARY_DIR})
  endif()
  if(WIN32)
    add_test(NAME ${name} COMMAND ${CMAKE_CROSSCOMPILING_EMULATOR} $<TARGET_FILE:${name}>
             WORKING_DIRECTORY ${T_WORKING_DIRECTORY})
    # One desktop for every Windows test: windows of two tests would take the focus from each other.
    set_tests_properties(${name} PROPERTIES RESOURCE_LOCK wine_desktop)
  else()
    gtest_discover_tests(${name} WORKING_DIRECTORY ${T_WORKING_DIRECTORY} DISCOVERY_TIMEOUT 60)
  endif()
endfunction()

# orvex_test_in_locales(NAME ja_JP=932 ...)  -- the Windows test program NAME again under Wine in each
# locale given (LOCALE=CODE-PAGE), as test NAME_cpCODE-PAGE: Wine takes the ANSI code page from the locale.
function(orvex_test_in_locales name)
  if(NOT WIN32)
    return()
  endif()
  foreach(pair ${ARGN})
    string(REPLACE "=" ";" _parts ${pair})
    list(GET _parts 0 _locale)
    list(GET _parts 1 _cp)
    add_test(NAME ${name}_cp${_cp} COMMAND ${CMAKE_CROSSCOMPILING_EMULATOR} $<TARGET_FILE:${name}>)
    set_tests_properties(${name}_cp${_cp} PROPERTIES
      ENVIRONMENT "LANG=${_locale}.UTF-8;LC_ALL=${_locale}.UTF-8" RESOURCE_LOCK wine_desktop)
  endforeach()
endfunction()

# orvex_fuzz_target(NAME SOURCES f.cpp LIBS lib)  -- only in the fuzz preset (clang, libFuzzer).
function(orvex_fuzz_target name)
  if(NOT ORVEX_FUZZ OR WIN32)
    return()
  endif()
  cmake_parse_arguments(F "" "" "SOURCES;LIBS" ${ARGN})
  add_executable(${name} ${F_SOURCES})
  target_link_libraries(${name} PRIVATE ${F_LIBS})
  # Undefined behaviour (an overflow, a bad shift) is a finding like a crash: it stops the run.
  target_compile_options(${name} PRIVATE -fsanitize=fuzzer,address,undefined -fno-sanitize-recover=undefined)
  target_link_options(${name} PRIVATE -fsanitize=fuzzer,address,undefined)
  set_property(GLOBAL APPEND PROPERTY ORVEX_FUZZ_TARGETS ${name})
endfunction()

# Portable libraries also get the fuzzer's coverage instrumentation in the fuzz build.
function(orvex_portable_library name)
  add_library(${name} STATIC ${ARGN})
  orvex_warnings(${name})
  if(ORVEX_FUZZ AND NOT WIN32)
    target_compile_options(${name} PRIVATE -fsanitize=fuzzer-no-link,address,undefined -fno-sanitize-recover=undefined)
  endif()
endfunction()
