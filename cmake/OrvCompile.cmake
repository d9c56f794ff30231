# How every target of this project is compiled: the language, the warnings, the sanitizers.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)

# Programs and DLLs in one folder: Windows finds a DLL beside the program that needs it.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/bin)
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/lib)
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY ${CMAKE_BINARY_DIR}/lib)

if(NOT CMAKE_BUILD_TYPE AND NOT CMAKE_CONFIGURATION_TYPES)
  set(CMAKE_BUILD_TYPE RelWithDebInfo CACHE STRING "Build type" FORCE)
endif()

find_package(Threads REQUIRED)

# The platform whose sources are compiled: the suffix of their file names.
if(WIN32)
  set(ORV_PLATFORM Windows)
  set(ORV_OTHER_PLATFORMS Posix)
else()
  set(ORV_PLATFORM Posix)
  set(ORV_OTHER_PLATFORMS "Windows;WinNT")
endif()

# Flags for everything, the tests and the benchmarks included.
add_library(orv_flags INTERFACE)
target_compile_options(orv_flags INTERFACE -Wall -Wextra
  $<$<BOOL:${ORV_WERROR}>:-Werror>)
if(WIN32)
  target_compile_definitions(orv_flags INTERFACE
    WIN32_LEAN_AND_MEAN NOMINMAX _WIN32_WINNT=0x0A00 __USE_MINGW_ANSI_STDIO=1)
endif()
if(ORV_SANITIZE)
  target_compile_options(orv_flags INTERFACE
    -fsanitize=${ORV_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  target_link_options(orv_flags INTERFACE -fsanitize=${ORV_SANITIZE})
endif()
target_link_libraries(orv_flags INTERFACE Threads::Threads)

# Flags for the libraries themselves.
add_library(orv_library_flags INTERFACE)
target_link_libraries(orv_library_flags INTERFACE orv_flags)
# The analysis of locks is for them alone: tests break its rules on purpose.
target_compile_options(orv_library_flags INTERFACE -Wpedantic -Wshadow -Wconversion
  $<$<CXX_COMPILER_ID:Clang>:-Wthread-safety>)
if(NOT WIN32)
  # Calls between functions of one library go straight to their target.
  target_compile_options(orv_library_flags INTERFACE -fno-semantic-interposition)
endif()
