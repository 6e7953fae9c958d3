# Libraries, headers, CMake package and pkg-config file. Components: runtime (the shared library), dev (what
# compiling and linking needs), tools, and player where it is built.
include(CMakePackageConfigHelpers)

install(TARGETS ${libraries} EXPORT simgp-targets
        LIBRARY COMPONENT runtime NAMELINK_COMPONENT dev
        RUNTIME COMPONENT runtime
        ARCHIVE COMPONENT dev)
foreach(header IN LISTS SIMGP_PUBLIC_HEADERS SIMGP_PUBLIC_CXX_HEADERS)
  get_filename_component(folder ${header} DIRECTORY)
  install(FILES ${header} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/${folder} COMPONENT dev)
endforeach()

if(TARGET simgp_shared)
  set_target_properties(simgp_shared PROPERTIES EXPORT_NAME simgp)
endif()
set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/simgp)
if(NOT SIMGP_SANITIZE)
  install(EXPORT simgp-targets NAMESPACE simgp:: DESTINATION ${package_dir} COMPONENT dev)
endif()
configure_package_config_file(cmake/simgp-config.cmake.in ${PROJECT_BINARY_DIR}/simgp-config.cmake
                              INSTALL_DESTINATION ${package_dir} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/simgp-config-version.cmake
                                 COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/simgp-config.cmake ${PROJECT_BINARY_DIR}/simgp-config-version.cmake
        DESTINATION ${package_dir} COMPONENT dev)

# Found from where the file lies, so that the installed tree can be moved, unless folders are absolute.
if(IS_ABSOLUTE "${CMAKE_INSTALL_LIBDIR}" OR IS_ABSOLUTE "${CMAKE_INSTALL_INCLUDEDIR}")
  set(pc_prefix ${CMAKE_INSTALL_PREFIX})
  set(pc_libdir ${CMAKE_INSTALL_FULL_LIBDIR})
  set(pc_includedir ${CMAKE_INSTALL_FULL_INCLUDEDIR})
else()
  file(RELATIVE_PATH up /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
  string(REGEX REPLACE "/$" "" up "${up}")
  set(pc_prefix "\${pcfiledir}/${up}")
  set(pc_libdir "\${prefix}/${CMAKE_INSTALL_LIBDIR}")
  set(pc_includedir "\${prefix}/${CMAKE_INSTALL_INCLUDEDIR}")
endif()
# On Windows the headers must know of a static library.
set(pc_static "")
if(WIN32)
  if(TARGET simgp_shared)
    set(pc_static "\nCflags.private: -DSIMGP_STATIC")
  else()
    set(pc_static " -DSIMGP_STATIC")
  endif()
endif()
configure_file(cmake/simgp.pc.in ${PROJECT_BINARY_DIR}/simgp.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/simgp.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT dev)
