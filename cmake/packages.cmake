# Packages for Debian, by `cpack -G DEB` in a build that is configured with the prefix /usr (the preset
# "packages"): libsimgp1, libsimgp-dev, simgp-tools and simgp-play, one for each component that the build has.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME simgp)
# Each package has a summary of its own.
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")
set(CPACK_PACKAGE_VENDOR "the simgp authors")
set(CPACK_PACKAGE_CONTACT "the simgp authors <simgp@localhost>")
set(CPACK_PACKAGING_INSTALL_PREFIX ${CMAKE_INSTALL_PREFIX})
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
set(CPACK_STRIP_FILES ON)
set(CPACK_VERBATIM_VARIABLES ON)
set(CPACK_COMPONENTS_ALL runtime dev)
if(TARGET simgp-convert)
  list(APPEND CPACK_COMPONENTS_ALL tools)
endif()
if(TARGET simgp-play)
  list(APPEND CPACK_COMPONENTS_ALL player)
endif()

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
# The tools are linked to the library of this build.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR})
set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)

# CPack indents it.
set(what_it_is "Conversion between planar, semi-planar, packed and tiled YUV and RGB,
resizing, turns, deblocking and dithering, with vector instructions and
the same result on every processor.")
# simgp_package(COMPONENT name section summary)
set(packages "")
macro(simgp_package component name section summary)
  list(APPEND packages "${component}:${name}")
  set(CPACK_DEBIAN_${component}_PACKAGE_NAME ${name})
  set(CPACK_DEBIAN_${component}_PACKAGE_SECTION ${section})
  set(CPACK_DEBIAN_${component}_DESCRIPTION "${summary}\n${what_it_is}")
endmacro()
simgp_package(RUNTIME libsimgp${PROJECT_VERSION_MAJOR} libs "pixel kernels for players, cameras and devices")
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
file(WRITE ${PROJECT_BINARY_DIR}/debian/triggers "activate-noawait ldconfig\n")
file(CHMOD ${PROJECT_BINARY_DIR}/debian/triggers PERMISSIONS OWNER_READ OWNER_WRITE GROUP_READ WORLD_READ)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA ${PROJECT_BINARY_DIR}/debian/triggers)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY >=)
simgp_package(DEV libsimgp-dev libdevel "pixel kernels for players, cameras and devices: what programs are made with")
simgp_package(TOOLS simgp-tools video "converts pictures and video frames, lists the pictures of streams")
# The library is in it.
simgp_package(PLAYER simgp-play video "shows films through the simgp library")
set(CPACK_COMPONENT_DEV_DEPENDS runtime)
set(CPACK_COMPONENT_TOOLS_DEPENDS runtime)

string(TOLOWER "${packages}" packages)
# Licence, changes and compressed manual pages go where Debian looks for them.
configure_file(cmake/debian.cmake.in ${PROJECT_BINARY_DIR}/debian.cmake @ONLY)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_BINARY_DIR}/debian.cmake)
include(CPack)
