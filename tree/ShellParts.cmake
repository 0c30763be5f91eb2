# The folder tree's shell side that needs no tree control: item id lists, display names, sub-folders
# and label paths. Windows only.
if(WIN32)
  add_library(orvex_tree_shell STATIC
    ${CMAKE_CURRENT_LIST_DIR}/ShellPidl.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ShellString.cpp
    ${CMAKE_CURRENT_LIST_DIR}/ShellNamespace.cpp
    ${CMAKE_CURRENT_LIST_DIR}/StartShellPath.cpp)
  target_include_directories(orvex_tree_shell PUBLIC ${PROJECT_SOURCE_DIR})
  target_link_libraries(orvex_tree_shell PUBLIC orvex_hostapi shell32 shlwapi ole32 user32)
  orvex_warnings(orvex_tree_shell)
endif()
