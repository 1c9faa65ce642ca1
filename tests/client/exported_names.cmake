# Checks that the shared library exports the functions that the public header declares and nothing
# else of its own, and that it leaves the opening of the system log to the program.
#
#   cmake -D NM=nm -D LIBRARY=libsecpolicy.so -D HEADER=secpolicy.h -P exported_names.cmake
cmake_minimum_required(VERSION 3.25)

function(symbols_of_library result)
  execute_process(COMMAND ${NM} -D -C ${ARGN} ${LIBRARY}
    OUTPUT_VARIABLE text COMMAND_ERROR_IS_FATAL ANY)
  # Semicolons and brackets would be taken for those of a list.
  string(REGEX REPLACE "[][;]" "_" text "${text}")
  string(REGEX REPLACE "\n" ";" lines "${text}")
  set(${result} "${lines}" PARENT_SCOPE)
endfunction()

# ---- What the header declares -------------------------------------------------------------------

file(STRINGS ${HEADER} declarations REGEX "^[a-z[][^/]* [A-Za-z]+\\(")
set(declared)
foreach(declaration IN LISTS declarations)
  string(REGEX REPLACE "^[^(]* ([A-Za-z]+)\\(.*" "\\1" name "${declaration}")
  list(APPEND declared ${name})
endforeach()
list(LENGTH declared count)
if(count LESS 40)
  message(FATAL_ERROR "only ${count} declarations were found in ${HEADER}")
endif()

# ---- What the library defines -------------------------------------------------------------------

symbols_of_library(symbols --defined-only)
set(exported)
foreach(symbol IN LISTS symbols)
  if(symbol MATCHES "^[0-9a-f]+ ([A-Za-z]) (.*)$")
    set(kind ${CMAKE_MATCH_1})
    set(name "${CMAKE_MATCH_2}")
    if(name MATCHES "^SecPolicy::([A-Za-z]+)(_abi:cxx11_)?\\(" AND kind STREQUAL "T")
      list(APPEND exported ${CMAKE_MATCH_1})
    elseif(name MATCHES "^SecPolicy::SecPolicyRetryException::")
      # Its constructors and its destructor.
    elseif(name MATCHES "^(vtable|typeinfo|typeinfo name) for (SecPolicy::SecPolicyRetryException|Tavon::Lib::TavonException)(@@|$)")
      # By which the exceptions are caught on the other side.
    elseif(kind STREQUAL "A" AND name MATCHES "^SECPOLICY_[0-9]+(@@|$)")
      # A version of the interface.
    elseif(kind MATCHES "[WuVv]" AND NOT name MATCHES "(SecPolicy|ZekCtl|StandIn)::")
      # Inline functions of the standard library and of the platform's headers.
    else()
      message(SEND_ERROR "exported, but not declared in the header: ${name} (${kind})")
    endif()
  endif()
endforeach()

foreach(name IN LISTS declared)
  if(NOT name IN_LIST exported)
    message(SEND_ERROR "declared in the header, but not exported: ${name}")
  endif()
endforeach()
foreach(name IN LISTS exported)
  if(NOT name IN_LIST declared)
    message(SEND_ERROR "exported, but not declared in the header: SecPolicy::${name}")
  endif()
endforeach()

# ---- What the library uses ----------------------------------------------------------------------

symbols_of_library(used --undefined-only)
foreach(name openlog closelog setlogmask)
  if(used MATCHES " ${name}(@|;|$)")
    message(SEND_ERROR "the library calls ${name}, which is the program's to call")
  endif()
endforeach()
if(NOT used MATCHES " (syslog|__syslog_chk)(@|;|$)")
  message(SEND_ERROR "the library does not call syslog")
endif()
