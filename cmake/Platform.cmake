# Which platform the library is linked with: SECPOLICY_PLATFORM_SHARED and SECPOLICY_PLATFORM_STATIC
# are what its two forms are linked with, SECPOLICY_PLATFORM_ITEMS an external one's libraries as those
# who link with what is installed name them.
set(SECPOLICY_PLATFORM stand-in CACHE STRING
  "Platform: stand-in (the stand-in host) or external (a target's library)")
set_property(CACHE SECPOLICY_PLATFORM PROPERTY STRINGS stand-in external)
set(SECPOLICY_PLATFORM_LIBRARY "" CACHE STRING
  "The external platform's library: the path of a file, or a name to link with; a list of them")

# One entry of SECPOLICY_PLATFORM_LIBRARY.
function(secpolicy_require_platform_library library)
  if(IS_ABSOLUTE "${library}")
    if(NOT EXISTS "${library}")
      message(FATAL_ERROR "SECPOLICY_PLATFORM_LIBRARY: there is no file ${library}")
    elseif(IS_DIRECTORY "${library}")
      message(FATAL_ERROR "SECPOLICY_PLATFORM_LIBRARY: ${library} is a directory")
    endif()
  elseif(NOT library MATCHES "^[A-Za-z0-9_+.-]+$" OR library MATCHES "^-")
    message(FATAL_ERROR "SECPOLICY_PLATFORM_LIBRARY: \"${library}\" is neither the absolute path of a "
      "file nor the name of a library to link with")
  endif()
endfunction()

# Whether a program finds the platform's classes in it. Anew with each configuration: another value,
# or another file of the same name, may be the right one.
function(secpolicy_require_platform_classes)
  try_compile(found
    SOURCES ${CMAKE_CURRENT_FUNCTION_LIST_DIR}/platform_check.cc
    CMAKE_FLAGS -DINCLUDE_DIRECTORIES=${PROJECT_SOURCE_DIR}/src
    LINK_LIBRARIES ${SECPOLICY_PLATFORM_LIBRARY}
    OUTPUT_VARIABLE output
    CXX_STANDARD 20
    CXX_STANDARD_REQUIRED ON
    NO_CACHE)
  if(NOT found)
    message(FATAL_ERROR "SECPOLICY_PLATFORM_LIBRARY: no program can be linked with "
      "\"${SECPOLICY_PLATFORM_LIBRARY}\" that uses ZekAccessInterfaceImpl and Sysinfo "
      "(src/platform):\n${output}")
  endif()
endfunction()

# Sets `build` and `installed` to what `library` is linked by, here and by those who link with what is
# installed. The linker writes the path of a shared library without a SONAME into what it makes, if it is
# given a path; so such a library is named by its file's name, and searched for.
function(secpolicy_platform_items library build installed)
  set(soname yes)
  if(IS_ABSOLUTE "${library}" AND library MATCHES "\\.so[0-9.]*$")
    execute_process(COMMAND ${CMAKE_READELF} -dW ${library}
      OUTPUT_VARIABLE dynamic ERROR_QUIET COMMAND_ERROR_IS_FATAL ANY)
    string(FIND "${dynamic}" "(SONAME)" soname)
  endif()
  if(soname STREQUAL "-1")
    cmake_path(GET library PARENT_PATH folder)
    cmake_path(GET library FILENAME name)
    set(${installed} "-l:${name}" PARENT_SCOPE)
    set(${build} "$<BUILD_INTERFACE:-L${folder}>" "-l:${name}" PARENT_SCOPE)
  else()
    set(${installed} "${library}" PARENT_SCOPE)
    set(${build} "${library}" PARENT_SCOPE)
  endif()
endfunction()

if(SECPOLICY_PLATFORM STREQUAL "stand-in")
  if(SECPOLICY_PLATFORM_LIBRARY)
    message(FATAL_ERROR "SECPOLICY_PLATFORM_LIBRARY is for SECPOLICY_PLATFORM=external")
  endif()
  set(SECPOLICY_PLATFORM_SHARED secpolicy_host)
  set(SECPOLICY_PLATFORM_STATIC secpolicy_host_static)
elseif(SECPOLICY_PLATFORM STREQUAL "external")
  if(NOT SECPOLICY_PLATFORM_LIBRARY)
    message(FATAL_ERROR "SECPOLICY_PLATFORM=external needs SECPOLICY_PLATFORM_LIBRARY: the platform's "
      "library, as the path of a file or as a name to link with")
  endif()
  foreach(library IN LISTS SECPOLICY_PLATFORM_LIBRARY)
    secpolicy_require_platform_library("${library}")
  endforeach()
  secpolicy_require_platform_classes()
  foreach(library IN LISTS SECPOLICY_PLATFORM_LIBRARY)
    secpolicy_platform_items("${library}" build installed)
    list(APPEND SECPOLICY_PLATFORM_SHARED ${build})
    list(APPEND SECPOLICY_PLATFORM_ITEMS ${installed})
  endforeach()
  set(SECPOLICY_PLATFORM_STATIC ${SECPOLICY_PLATFORM_SHARED})
else()
  message(FATAL_ERROR
    "SECPOLICY_PLATFORM is \"${SECPOLICY_PLATFORM}\": it can be stand-in or external")
endif()
