# Stands in for platform/: the names of our own libraries, made of the files that this site has.

# The plug-in looks for them where they were at build time too.
set(CMAKE_INSTALL_RPATH_USE_LINK_PATH ON)

function(hcli_given target variable)
  add_library(${target} INTERFACE)
  if(NOT ${variable})
    message(FATAL_ERROR "HCLI_PLUGIN_ONLY: set ${variable} to the library to link, as a path")
  endif()
  foreach(file IN LISTS ${variable})
    if(NOT EXISTS "${file}")
      message(FATAL_ERROR "HCLI_PLUGIN_ONLY: ${variable}: no such file: ${file}")
    endif()
    target_link_libraries(${target} INTERFACE "${file}")
  endforeach()
endfunction()

hcli_given(plinth HCLI_FRAMEWORK_LIBRARY)
hcli_given(corectl HCLI_STORAGE_LIBRARIES)
hcli_given(ima HCLI_IMA_LIBRARY)
