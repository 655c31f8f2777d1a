# hcli_library(NAME SHARED|MODULE|OBJECT [SOURCES FILE...] [LINK TARGET...] [SEES FOLDER...] [INCLUDE FOLDER...])
#
# Without SOURCES the target is made of every .cpp file in the folder and below it. A MODULE is a plug-in. What the
# target SEES and INCLUDEs is its own: who links it does not get at its headers by that.
function(hcli_library name kind)
  cmake_parse_arguments(PARSE_ARGV 2 arg "" "" "SOURCES;LINK;SEES;INCLUDE")
  hcli_sources(sources "${arg_SOURCES}")
  add_library(${name} ${kind} ${sources})
  target_include_directories(${name} PRIVATE ${arg_INCLUDE})
  hcli_see(${name} ${arg_SEES})
  # PUBLIC for objects: what they need is needed by the binary that takes them in.
  if(kind STREQUAL "OBJECT")
    target_link_libraries(${name} PUBLIC Boost::headers ${arg_LINK})
  else()
    target_link_libraries(${name} PRIVATE Boost::headers ${arg_LINK})
  endif()
  set_target_properties(${name} PROPERTIES DEFINE_SYMBOL "")
  target_precompile_headers(${name} REUSE_FROM hcli-precompiled)
  if(kind STREQUAL "MODULE")
    set_target_properties(${name} PROPERTIES
      PREFIX "" LIBRARY_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/${HCLI_PLUGIN_FOLDER}")
    install(TARGETS ${name} LIBRARY DESTINATION ${HCLI_PLUGIN_FOLDER})
    set_property(GLOBAL APPEND PROPERTY HCLI_PLUGINS ${name})
    if(EXISTS "${CMAKE_CURRENT_SOURCE_DIR}/guide.yaml")
      hcli_guide(${name})
    endif()
  elseif(kind STREQUAL "SHARED")
    install(TARGETS ${name} LIBRARY DESTINATION lib)
  endif()
endfunction()

# hcli_program(NAME [SOURCES FILE...] [LINK TARGET...] [SEES FOLDER...] [INCLUDE FOLDER...]): an executable in bin/. The
# caller installs it, or does not.
function(hcli_program name)
  cmake_parse_arguments(PARSE_ARGV 1 arg "" "" "SOURCES;LINK;SEES;INCLUDE")
  hcli_sources(sources "${arg_SOURCES}")
  add_executable(${name} ${sources})
  target_include_directories(${name} PRIVATE ${arg_INCLUDE})
  hcli_see(${name} ${arg_SEES})
  target_link_libraries(${name} PRIVATE ${arg_LINK})
  # The one search path, which holds for what the libraries and plug-ins need as well: with one of its own for each of
  # them, the dynamic linker would look into some eighty folders that do not exist.
  set_target_properties(${name} PROPERTIES INSTALL_RPATH "$ORIGIN/../lib")
  target_link_options(${name} PRIVATE LINKER:--disable-new-dtags)
endfunction()

# hcli_see(TARGET FOLDER...): each FOLDER, named from the top of the tree, is there for the target to include from, as
# "host/Host.h" from platform/host; its neighbours are not, so that an include against the layers does not compile.
function(hcli_see target)
  foreach(folder IN LISTS ARGN)
    get_filename_component(name "${folder}" NAME)
    set(view "${PROJECT_BINARY_DIR}/include/${folder}")
    file(MAKE_DIRECTORY "${view}")
    file(CREATE_LINK "${PROJECT_SOURCE_DIR}/${folder}" "${view}/${name}" SYMBOLIC)
    target_include_directories(${target} PRIVATE "${view}")
  endforeach()
endfunction()

# The given files, or else every .cpp file of the current folder and below.
function(hcli_sources result given)
  if(NOT given)
    file(GLOB_RECURSE given CONFIGURE_DEPENDS "${CMAKE_CURRENT_SOURCE_DIR}/*.cpp")
  endif()
  set(${result} ${given} PARENT_SCOPE)
endfunction()

# One precompiled header serves all libraries: their flags are the same. To be called once, ahead of the targets.
function(hcli_precompile)
  file(CONFIGURE OUTPUT "${PROJECT_BINARY_DIR}/precompiled.cpp" CONTENT "")
  add_library(hcli-precompiled OBJECT "${PROJECT_BINARY_DIR}/precompiled.cpp")
  target_link_libraries(hcli-precompiled PRIVATE Boost::headers)
  target_precompile_headers(hcli-precompiled PRIVATE
    <boost/enable_shared_from_this.hpp> <boost/shared_ptr.hpp> <algorithm> <cstdint> <functional> <map> <memory>
    <optional> <set> <stdexcept> <string> <string_view> <utility> <vector>)
endfunction()

# hcli_guide(NAME): the folder's guide.yaml, which help and completion read, as share/hcli/guides/NAME.yaml of both trees.
function(hcli_guide name)
  set(guides "${PROJECT_BINARY_DIR}/share/hcli/guides")
  install(FILES guide.yaml DESTINATION share/hcli/guides RENAME ${name}.yaml)
  file(MAKE_DIRECTORY "${guides}")
  file(CREATE_LINK "${CMAKE_CURRENT_SOURCE_DIR}/guide.yaml" "${guides}/${name}.yaml" SYMBOLIC)
  set_property(GLOBAL APPEND PROPERTY HCLI_GUIDES "${CMAKE_CURRENT_SOURCE_DIR}/guide.yaml")
endfunction()

# hcli_manual(): manual pages of all commands, in share/man of both trees, by the program itself. To be called once,
# behind the plug-ins.
function(hcli_manual)
  get_property(plugins GLOBAL PROPERTY HCLI_PLUGINS)
  get_property(guides GLOBAL PROPERTY HCLI_GUIDES)
  set(pages "${PROJECT_BINARY_DIR}/share/man/man1")
  add_custom_command(OUTPUT "${pages}/hcli.1"
    COMMAND ${CMAKE_COMMAND} -E rm -rf "${pages}"
    COMMAND ${CMAKE_COMMAND} -E make_directory "${pages}"
    COMMAND ${CMAKE_COMMAND} -E env --unset=HCLI_PLUGINS $<TARGET_FILE:hcli> --quiet manual --folder "${pages}"
    DEPENDS hcli plinth ${plugins} ${guides} COMMENT "Writing the manual pages" VERBATIM)
  add_custom_target(manual ALL DEPENDS "${pages}/hcli.1")
  install(DIRECTORY "${PROJECT_BINARY_DIR}/share/man" DESTINATION share)
endfunction()

# hcli_share(FOLDER): data, in share/hcli of both trees. The build tree has a link, so that an edit needs no build.
function(hcli_share folder)
  install(DIRECTORY "${PROJECT_SOURCE_DIR}/${folder}" DESTINATION share/hcli OPTIONAL)
  file(MAKE_DIRECTORY "${PROJECT_BINARY_DIR}/share/hcli")
  file(CREATE_LINK "${PROJECT_SOURCE_DIR}/${folder}" "${PROJECT_BINARY_DIR}/share/hcli/${folder}" SYMBOLIC)
endfunction()
