# Language level, output folders, warnings, sanitizers: what every target of this tree shares.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_C_VISIBILITY_PRESET hidden)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

if(PROJECT_IS_TOP_LEVEL)
  set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
  set(CMAKE_RUNTIME_OUTPUT_DIRECTORY "${CMAKE_BINARY_DIR}/bin")
  set(CMAKE_LIBRARY_OUTPUT_DIRECTORY "${CMAKE_BINARY_DIR}/lib")
  # The static pieces are an inner matter; lib/ shows only what a user links.
  set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY "${CMAKE_BINARY_DIR}/archive")

  if(NOT CMAKE_BUILD_TYPE AND NOT CMAKE_CONFIGURATION_TYPES)
    set(CMAKE_BUILD_TYPE Release CACHE STRING "Build type" FORCE)
  endif()

  find_program(ZR_CCACHE ccache)
  if(ZR_CCACHE AND NOT CMAKE_CXX_COMPILER_LAUNCHER)
    set(CMAKE_C_COMPILER_LAUNCHER "${ZR_CCACHE}")
    set(CMAKE_CXX_COMPILER_LAUNCHER "${ZR_CCACHE}")
  endif()
endif()

# Linked PRIVATE by every target of our own; generated code included.
add_library(zr_warnings INTERFACE)
target_compile_options(zr_warnings INTERFACE -Wall -Wextra -Wpedantic -Wshadow -Werror)
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  # GCC 12 sees overlaps in every optimised concatenation of strings (its bug 105651).
  target_compile_options(zr_warnings INTERFACE -Wno-restrict)
endif()

if(ZR_SANITIZE)
  if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    # With sanitizers GCC takes parts of std::regex for uninitialised (its bug 105562).
    target_compile_options(zr_warnings INTERFACE -Wno-maybe-uninitialized)
  endif()
  add_compile_options(-fsanitize=${ZR_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  add_link_options(-fsanitize=${ZR_SANITIZE})
endif()

if(ZR_COVERAGE)
  # Tests start threads, and some of them end a process without its destructors: atomic counts stay right.
  add_compile_options(--coverage -fprofile-abs-path -fprofile-update=prefer-atomic)
  add_link_options(--coverage)
endif()

if(ZR_FUZZ)
  # What the fuzzer learns from: every piece tells which of its edges ran. The fuzzer itself comes with the targets.
  add_compile_options(-fsanitize=fuzzer-no-link)
endif()

# zr_add_folders(FOLDER...): add_subdirectory() for each that is there.
function(zr_add_folders)
  foreach(folder IN LISTS ARGN)
    if(EXISTS "${PROJECT_SOURCE_DIR}/${folder}/CMakeLists.txt")
      add_subdirectory("${PROJECT_SOURCE_DIR}/${folder}" "${PROJECT_BINARY_DIR}/${folder}")
    endif()
  endforeach()
endfunction()
