# The public headers in one folder, the libraries, the CMake package and the pkg-config files.
include(CMakePackageConfigHelpers)

# Platform headers that a user may name; all others are hidden behind their facades.
if(WIN32)
  set(public_platform_headers exSysErrorWindows.h)
else()
  set(public_platform_headers exSysErrorPosix.h)
endif()
# Headers that only their own library uses.
set(internal_headers inPackageRegistry.h)

# The public headers of a module's folder.
function(orv_public_headers out folder)
  file(GLOB headers CONFIGURE_DEPENDS ${folder}/*.h ${folder}/*.imp)
  set(result "")
  foreach(header IN LISTS headers)
    cmake_path(GET header FILENAME file)
    if(file IN_LIST internal_headers)
      continue()
    endif()
    if(file IN_LIST public_platform_headers
       OR NOT file MATCHES "(Native|Posix|Windows|WinNT|Private)\\.h$")
      list(APPEND result ${header})
    endif()
  endforeach()
  set(${out} ${result} PARENT_SCOPE)
endfunction()

# Collects the public headers of some folders in <build>/include/orv, with an umbrella header.
set(public_include ${CMAKE_BINARY_DIR}/include/orv)
function(orv_collect_headers umbrella)
  set(text "// Every public header of ${umbrella}.\n#pragma once\n\n")
  foreach(folder IN LISTS ARGN)
    orv_public_headers(headers ${folder})
    foreach(header IN LISTS headers)
      cmake_path(GET header FILENAME file)
      file(CREATE_LINK ${header} ${public_include}/${file} SYMBOLIC)
      install(FILES ${header} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/orv)
      if(file MATCHES "\\.h$")
        string(APPEND text "#include \"${file}\"\n")
      endif()
    endforeach()
  endforeach()
  file(CONFIGURE OUTPUT ${public_include}/${umbrella} CONTENT "${text}" @ONLY)
  install(FILES ${public_include}/${umbrella} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/orv)
endfunction()

file(REMOVE_RECURSE ${public_include})
file(MAKE_DIRECTORY ${public_include})
orv_collect_headers(base.h ${CMAKE_CURRENT_SOURCE_DIR}/src/base)
set(module_folders "")
foreach(module IN LISTS ORV_MODULES)
  if(NOT module STREQUAL "base")
    list(APPEND module_folders ${CMAKE_CURRENT_SOURCE_DIR}/src/resmgt/${module})
  endif()
endforeach()
orv_collect_headers(resmgt.h ${module_folders})

install(TARGETS ORVbase ORVresmgt EXPORT ORV)
install(EXPORT ORV NAMESPACE ORV:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/ORV
        FILE ORVTargets.cmake)
configure_package_config_file(cmake/ORVConfig.cmake.in ${CMAKE_BINARY_DIR}/ORVConfig.cmake
  INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/ORV)
write_basic_package_version_file(${CMAKE_BINARY_DIR}/ORVConfigVersion.cmake
  COMPATIBILITY SameMinorVersion)
install(FILES ${CMAKE_BINARY_DIR}/ORVConfig.cmake ${CMAKE_BINARY_DIR}/ORVConfigVersion.cmake
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/ORV)
# The pkg-config files find their prefix from where they lie, so the folder may be moved.
set(pkg_config_folder ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
file(RELATIVE_PATH ORV_PC_TO_PREFIX /prefix/${pkg_config_folder} /prefix)
foreach(library base resmgt)
  configure_file(cmake/orv-${library}.pc.in ${CMAKE_BINARY_DIR}/orv-${library}.pc @ONLY)
  install(FILES ${CMAKE_BINARY_DIR}/orv-${library}.pc
          DESTINATION ${pkg_config_folder})
endforeach()
