# Which platform the library is linked with: SECPOLICY_PLATFORM_SHARED and SECPOLICY_PLATFORM_STATIC
# are what its two forms are linked with.
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
  set(SECPOLICY_PLATFORM_SHARED ${SECPOLICY_PLATFORM_LIBRARY})
  set(SECPOLICY_PLATFORM_STATIC ${SECPOLICY_PLATFORM_LIBRARY})
else()
  message(FATAL_ERROR
    "SECPOLICY_PLATFORM is \"${SECPOLICY_PLATFORM}\": it can be stand-in or external")
endif()
