# What the OpenSSF compiler guide asks for, as far as the compiler at hand has it, added to the
# interface target secpolicy_options. scripts/hardening looks for the traces in the built files.
include(CheckCXXCompilerFlag)
include(CheckLinkerFlag)
include(CheckPIESupported)

# A program is as position-independent as its libraries.
check_pie_supported(LANGUAGES CXX)

function(secpolicy_harden_compilation)
  foreach(flag ${ARGN})
    string(MAKE_C_IDENTIFIER "SECPOLICY_HAS${flag}" known)
    check_cxx_compiler_flag(${flag} ${known})
    if(${known})
      target_compile_options(secpolicy_options INTERFACE ${flag})
    endif()
  endforeach()
endfunction()

function(secpolicy_harden_linking)
  foreach(flag ${ARGN})
    string(MAKE_C_IDENTIFIER "SECPOLICY_LINKS${flag}" known)
    check_linker_flag(CXX ${flag} ${known})
    if(${known})
      target_link_options(secpolicy_options INTERFACE ${flag})
    endif()
  endforeach()
endfunction()

# Mistakes that the compiler can see.
target_compile_options(secpolicy_options INTERFACE
  -Wformat=2 -Werror=format-security -Wimplicit-fallthrough)
secpolicy_harden_compilation(-Wtrampolines -Wbidi-chars=any)

# Mistakes that it cannot, stopped at run time or kept harmless.
secpolicy_harden_compilation(
  -fstack-protector-strong -fstack-clash-protection -ftrivial-auto-var-init=zero
  -fno-delete-null-pointer-checks -fno-strict-overflow -fno-strict-aliasing)
if(CMAKE_SYSTEM_PROCESSOR MATCHES "x86_64|AMD64")
  secpolicy_harden_compilation(-fcf-protection=full)
elseif(CMAKE_SYSTEM_PROCESSOR MATCHES "aarch64|arm64")
  secpolicy_harden_compilation(-mbranch-protection=standard)
endif()
target_compile_definitions(secpolicy_options INTERFACE _GLIBCXX_ASSERTIONS)

# It needs an optimising compiler, and the sanitizers put their own checks in the same places.
if(NOT SECPOLICY_SANITIZE)
  target_compile_options(secpolicy_options INTERFACE
    $<$<CONFIG:Release,RelWithDebInfo,MinSizeRel>:-U_FORTIFY_SOURCE$<SEMICOLON>-D_FORTIFY_SOURCE=3>)
endif()

secpolicy_harden_linking(
  -Wl,-z,relro -Wl,-z,now -Wl,-z,noexecstack -Wl,--as-needed -Wl,--no-copy-dt-needed-entries)
