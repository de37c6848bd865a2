# How everything of the project is compiled.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
# Build folders are reached through ccache's base folder; relative paths let one build's objects serve another.
find_program(CCACHE_PROGRAM ccache)
if(CCACHE_PROGRAM)
  set(CMAKE_CXX_COMPILER_LAUNCHER ${CCACHE_PROGRAM})
endif()

add_library(lumora-compile INTERFACE)
target_compile_options(
  lumora-compile
  INTERFACE -pthread # for all, as GLib's own flags have it: precompiled headers are shared only between like options
            -Wall
            -Wextra
            -Wpedantic
            $<IF:$<CXX_COMPILER_ID:GNU>,-Wshadow=local,-Wshadow>
            -Wconversion
            -Wsign-conversion
            -Wold-style-cast
            -Wnon-virtual-dtor
            -Woverloaded-virtual
            -Wcast-qual
            -Wformat=2
            -Wundef
            -Wimplicit-fallthrough
            $<$<BOOL:${LUMORAKIT_WARNINGS_AS_ERRORS}>:-Werror>)
if(CMAKE_CXX_COMPILER_ID STREQUAL GNU AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
  # Optimising, g++ 12 sees overlapping and endless copies in `"text" + std::string` (GCC bugs 105329 and 105651), in
  # release builds and, with the sanitizers' code in between, in theirs.
  target_compile_options(lumora-compile INTERFACE -Wno-array-bounds -Wno-restrict -Wno-stringop-overflow)
endif()
target_include_directories(lumora-compile INTERFACE $<BUILD_INTERFACE:${PROJECT_SOURCE_DIR}>)
if(LUMORAKIT_EXPORT_INTERNALS)
  target_compile_definitions(lumora-compile INTERFACE LUMORAKIT_EXPORT_INTERNALS)
endif()

if(LUMORAKIT_COVERAGE)
  if(NOT CMAKE_CXX_COMPILER_ID STREQUAL "Clang")
    message(FATAL_ERROR "LUMORAKIT_COVERAGE needs clang++: use the preset coverage")
  endif()
  add_compile_options(-fprofile-instr-generate -fcoverage-mapping)
  add_link_options(-fprofile-instr-generate)
endif()

if(LUMORAKIT_SANITIZE)
  add_compile_options(-fsanitize=${LUMORAKIT_SANITIZE} -fno-omit-frame-pointer)
  add_link_options(-fsanitize=${LUMORAKIT_SANITIZE})
  # With the sanitizers' code in between, g++ 12 takes an empty std::optional for an uninitialised one.
  add_compile_options($<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
  if(LUMORAKIT_SANITIZE MATCHES undefined)
    add_compile_options(-fno-sanitize-recover=all)
  endif()
endif()

# For precompiled headers. Every source still includes what it uses: the linter's build has none.
set(LUMORA_STANDARD_HEADERS
    <algorithm> <atomic> <chrono> <condition_variable> <filesystem> <functional> <map> <memory> <mutex> <optional>
    <string> <string_view> <variant> <vector>)
