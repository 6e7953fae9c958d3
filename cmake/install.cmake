# Libraries, headers, CMake package and pkg-config file.
include(CMakePackageConfigHelpers)

install(TARGETS simgp_shared simgp_static EXPORT simgp-targets)
foreach(header IN LISTS SIMGP_PUBLIC_HEADERS)
  get_filename_component(folder ${header} DIRECTORY)
  install(FILES ${header} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/${folder})
endforeach()

set_target_properties(simgp_shared PROPERTIES EXPORT_NAME simgp)
set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/simgp)
if(NOT SIMGP_SANITIZE)
  install(EXPORT simgp-targets NAMESPACE simgp:: DESTINATION ${package_dir})
endif()
file(WRITE ${PROJECT_BINARY_DIR}/simgp-config.cmake
     "include(\${CMAKE_CURRENT_LIST_DIR}/simgp-targets.cmake)\n")
write_basic_package_version_file(${PROJECT_BINARY_DIR}/simgp-config-version.cmake
                                 COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/simgp-config.cmake ${PROJECT_BINARY_DIR}/simgp-config-version.cmake
        DESTINATION ${package_dir})

configure_file(cmake/simgp.pc.in ${PROJECT_BINARY_DIR}/simgp.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/simgp.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
