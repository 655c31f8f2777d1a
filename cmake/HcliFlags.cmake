# The flags of every target, in this one place.

set(CMAKE_CXX_STANDARD 20)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
# A library gives away what a header declares under default visibility, and keeps the rest to itself: names of one
# library can then not take the place of another's, and there is less to bind when it is loaded.
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(CMAKE_COMPILE_WARNING_AS_ERROR ON)
set(CMAKE_CXX_FLAGS_RELEASE "-O2 -DNDEBUG")
if(NOT CMAKE_BUILD_TYPE)
  set(CMAKE_BUILD_TYPE Release)
endif()

add_compile_options(-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wnon-virtual-dtor -Woverloaded-virtual
                    -fno-semantic-interposition)
# Every run loads all libraries anew, so what the dynamic linker does is most of the time that a short command takes:
# a library binds to itself without look-ups, is mapped in fewer pieces, and lists its thousands of addresses packed.
add_link_options(LINKER:-O1 LINKER:--as-needed LINKER:--hash-style=gnu LINKER:-Bsymbolic LINKER:-z,noseparate-code
                 LINKER:-z,pack-relative-relocs)

if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
  add_compile_options(-fpch-preprocess)  # lets ccache see which precompiled header a source was compiled with
endif()

if(HCLI_CHECKED)
  add_compile_definitions(HCLI_CHECKED=1)
endif()

if(HCLI_SANITIZERS)
  add_compile_options(-fsanitize=${HCLI_SANITIZERS} -fno-sanitize-recover=all -fno-omit-frame-pointer)
  add_link_options(-fsanitize=${HCLI_SANITIZERS})
  # The instrumented code makes g++ see uninitialised reads that are none; the builds without it keep the warning.
  add_compile_options($<$<CXX_COMPILER_ID:GNU>:-Wno-maybe-uninitialized>)
else()
  # Clang leaves the sanitizers' own symbols open in libraries, so only builds without them can ask for this.
  add_link_options($<$<IN_LIST:$<TARGET_PROPERTY:TYPE>,SHARED_LIBRARY$<SEMICOLON>MODULE_LIBRARY>:LINKER:--no-undefined>)
endif()

# The build tree mirrors the install tree, so the same relative search paths serve both.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/bin")
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/lib")
set(CMAKE_BUILD_WITH_INSTALL_RPATH ON)
set(HCLI_PLUGIN_FOLDER lib/hcli/plugins)

find_program(HCLI_CCACHE ccache)
if(HCLI_CCACHE AND NOT DEFINED CMAKE_CXX_COMPILER_LAUNCHER)
  # A precompiled header carries time stamps; without this leave ccache could never reuse what was built
  # with one.
  set(CMAKE_CXX_COMPILER_LAUNCHER
      env CCACHE_SLOPPINESS=pch_defines,time_macros,include_file_mtime,include_file_ctime CCACHE_NOHASHDIR=1
      "CCACHE_BASEDIR=${PROJECT_SOURCE_DIR}" "${HCLI_CCACHE}")
endif()
