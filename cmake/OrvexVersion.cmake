# The product's version comes from project(VERSION) alone; this makes the header the resource script and the
# code read it from: version numbers, the text forms, the copyright line, and the commit the build is made of.
#
# The commit is read when CMake configures; the configure step runs again when the checked-out commit
# changes (the files behind HEAD are dependencies of the configure step), so a build never shows a stale one.

set(ORVEX_COPYRIGHT "Copyright (C) 2026 The Orvex1 developers. All rights reserved.")
set(ORVEX_DESCRIPTION "Orvex1 drawing thumbnail explorer")

set(ORVEX_COMMIT "unknown")
find_package(Git QUIET)
if(GIT_FOUND)
  execute_process(COMMAND ${GIT_EXECUTABLE} rev-parse --short=12 HEAD
                  WORKING_DIRECTORY ${PROJECT_SOURCE_DIR} OUTPUT_VARIABLE _commit
                  RESULT_VARIABLE _rc OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
  if(_rc EQUAL 0 AND _commit)
    set(ORVEX_COMMIT ${_commit})
    # HEAD, the branch it names and the packed references: any of them changes when the commit does.
    foreach(_ref HEAD packed-refs)
      execute_process(COMMAND ${GIT_EXECUTABLE} rev-parse --path-format=absolute --git-path ${_ref}
                      WORKING_DIRECTORY ${PROJECT_SOURCE_DIR} OUTPUT_VARIABLE _path
                      OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
      if(_path AND EXISTS ${_path})
        set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${_path})
      endif()
    endforeach()
    execute_process(COMMAND ${GIT_EXECUTABLE} symbolic-ref -q HEAD
                    WORKING_DIRECTORY ${PROJECT_SOURCE_DIR} OUTPUT_VARIABLE _branch
                    OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
    if(_branch)
      execute_process(COMMAND ${GIT_EXECUTABLE} rev-parse --path-format=absolute --git-path ${_branch}
                      WORKING_DIRECTORY ${PROJECT_SOURCE_DIR} OUTPUT_VARIABLE _path
                      OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
      if(_path AND EXISTS ${_path})
        set_property(DIRECTORY ${PROJECT_SOURCE_DIR} APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${_path})
      endif()
    endif()
  endif()
endif()

set(ORVEX_VERSION_HEADER ${CMAKE_BINARY_DIR}/generated/OrvexVersion.h)
configure_file(${PROJECT_SOURCE_DIR}/res/OrvexVersion.h.in ${ORVEX_VERSION_HEADER} @ONLY)
include_directories(BEFORE ${CMAKE_BINARY_DIR}/generated)
