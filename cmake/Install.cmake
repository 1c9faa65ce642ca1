# What is installed, and where. Without SECPOLICY_INSTALL these functions do nothing.
#
# Components: Runtime (shared libraries), Development, Command. Export sets: SecPolicyTargets (shared
# libraries) and SecPolicyStaticTargets.
include(CMakePackageConfigHelpers)

set(SECPOLICY_PACKAGE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/SecPolicy)
set(SECPOLICY_PKG_CONFIG_DIR ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
set(SECPOLICY_CMAKE_DIR ${CMAKE_CURRENT_LIST_DIR})

# `target`, installed in the folder `from`, finds its libraries relative to its own place, whatever
# the prefix: `cmake --install --prefix` may choose another one than was configured, and the loader's
# cache need not know it. Distributions turn this off with CMAKE_SKIP_INSTALL_RPATH.
function(secpolicy_find_libraries_from target from)
  if(DEFINED CMAKE_INSTALL_RPATH OR IS_ABSOLUTE "${from}" OR IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
    return()
  endif()
  file(RELATIVE_PATH way "/${from}" "/${CMAKE_INSTALL_LIBDIR}")
  string(REGEX REPLACE "/$" "" path "$ORIGIN/${way}")
  set_target_properties(${target} PROPERTIES INSTALL_RPATH "${path}")
endfunction()

# Installs a library, which others find as SecPolicy::`export`.
function(secpolicy_install_library target export)
  if(NOT SECPOLICY_INSTALL)
    return()
  endif()
  set_target_properties(${target} PROPERTIES EXPORT_NAME ${export})
  get_target_property(type ${target} TYPE)
  if(type STREQUAL "SHARED_LIBRARY")
    secpolicy_find_libraries_from(${target} ${CMAKE_INSTALL_LIBDIR})
    install(TARGETS ${target} EXPORT SecPolicyTargets
      LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
      COMPONENT Runtime NAMELINK_COMPONENT Development)
  else()
    install(TARGETS ${target} EXPORT SecPolicyStaticTargets
      ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT Development)
  endif()
endfunction()

# secpolicy_install_headers(FILE... [IN FOLDER]): into include/secpolicy/, or a folder of it.
function(secpolicy_install_headers)
  if(NOT SECPOLICY_INSTALL)
    return()
  endif()
  cmake_parse_arguments(headers "" "IN" "" ${ARGN})
  install(FILES ${headers_UNPARSED_ARGUMENTS} COMPONENT Development
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/secpolicy/${headers_IN})
endfunction()

# Installs the file `name`, made from cmake/`name`.in, for pkg-config. Its paths are relative to where
# it lies, as far as the folders are relative to the prefix.
function(secpolicy_install_pkg_config name)
  if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}")
    set(pc_prefix ${CMAKE_INSTALL_PREFIX})
  else()
    file(RELATIVE_PATH way "/${SECPOLICY_PKG_CONFIG_DIR}" "/")
    string(REGEX REPLACE "/$" "" pc_prefix "\${pcfiledir}/${way}")
  endif()
  foreach(folder LIBDIR INCLUDEDIR)
    set(pc_${folder} "${CMAKE_INSTALL_${folder}}")
    if(NOT IS_ABSOLUTE "${pc_${folder}}")
      string(PREPEND pc_${folder} "\${prefix}/")
    endif()
  endforeach()
  configure_file(${SECPOLICY_CMAKE_DIR}/${name}.in ${PROJECT_BINARY_DIR}/cmake/${name} @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/cmake/${name}
    DESTINATION ${SECPOLICY_PKG_CONFIG_DIR} COMPONENT Development)
endfunction()

# Installs what find_package(SecPolicy) and pkg-config read. Called once, when all libraries are there.
function(secpolicy_install_package)
  if(NOT SECPOLICY_INSTALL)
    return()
  endif()
  configure_package_config_file(${SECPOLICY_CMAKE_DIR}/SecPolicyConfig.cmake.in
    ${PROJECT_BINARY_DIR}/cmake/SecPolicyConfig.cmake
    INSTALL_DESTINATION ${SECPOLICY_PACKAGE_DIR}
    NO_SET_AND_CHECK_MACRO)
  # Before version 1, a new minor version may break what an older one offered.
  write_basic_package_version_file(${PROJECT_BINARY_DIR}/cmake/SecPolicyConfigVersion.cmake
    COMPATIBILITY SameMinorVersion)
  install(FILES ${PROJECT_BINARY_DIR}/cmake/SecPolicyConfig.cmake
    ${PROJECT_BINARY_DIR}/cmake/SecPolicyConfigVersion.cmake
    DESTINATION ${SECPOLICY_PACKAGE_DIR} COMPONENT Development)
  foreach(set SecPolicyTargets SecPolicyStaticTargets)
    install(EXPORT ${set} NAMESPACE SecPolicy::
      DESTINATION ${SECPOLICY_PACKAGE_DIR} COMPONENT Development)
  endforeach()
  if(SECPOLICY_PLATFORM STREQUAL "stand-in")
    set(pc_requires "Requires: secpolicy-host")
    secpolicy_install_pkg_config(secpolicy-host.pc)
  else()
    list(TRANSFORM SECPOLICY_PLATFORM_ITEMS REPLACE "^([^/-].*)$" "-l\\1" OUTPUT_VARIABLE libraries)
    list(JOIN libraries " " pc_platform)
    string(PREPEND pc_platform " ")
  endif()
  secpolicy_install_pkg_config(secpolicy.pc)
endfunction()
