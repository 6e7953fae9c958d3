# What leaves the shared library: the names in exports.txt, told to each kind of linker in its own way, and
# what else that linker should know.
set(SIMGP_EXPORTS ${PROJECT_SOURCE_DIR}/cmake/exports.txt)
set_property(DIRECTORY APPEND PROPERTY CMAKE_CONFIGURE_DEPENDS ${SIMGP_EXPORTS})
file(STRINGS ${SIMGP_EXPORTS} exports REGEX "^[a-z]")

if(WIN32)
  foreach(library IN LISTS libraries)
    if(library STREQUAL simgp_static)
      target_compile_definitions(simgp_static INTERFACE SIMGP_STATIC)
    endif()
  endforeach()
endif()
if(NOT TARGET simgp_shared)
  return()
endif()
set_target_properties(simgp_shared PROPERTIES VERSION ${PROJECT_VERSION} SOVERSION ${PROJECT_VERSION_MAJOR})

if(WIN32)
  # PE: tables are marked, since a call can go through a stub and an access to data cannot. The number of
  # the interface is part of the DLL's name.
  list(TRANSFORM exports REPLACE "^((simgp_)?tbl_.*)$" "\\1 DATA")
  list(JOIN exports "\n    " exports)
  set(export_list ${PROJECT_BINARY_DIR}/simgp.def)
  file(GENERATE OUTPUT ${export_list} CONTENT "EXPORTS\n    ${exports}\n")
  set_target_properties(simgp_shared PROPERTIES RUNTIME_OUTPUT_NAME simgp-${PROJECT_VERSION_MAJOR})
  target_sources(simgp_shared PRIVATE ${export_list})
  target_link_options(simgp_shared PRIVATE -static-libgcc)
elseif(APPLE)
  # Mach-O: names of C begin with an underscore.
  list(TRANSFORM exports PREPEND _)
  list(JOIN exports "\n" exports)
  set(export_list ${PROJECT_BINARY_DIR}/simgp.symbols)
  file(GENERATE OUTPUT ${export_list} CONTENT "${exports}\n")
  target_link_options(simgp_shared PRIVATE "LINKER:-exported_symbols_list,${export_list}" "LINKER:-dead_strip_dylibs")
else()
  # ELF: a version script. Segments suit pages of 16 KiB.
  list(JOIN exports "$<SEMICOLON>\n        " exports)
  set(export_list ${PROJECT_BINARY_DIR}/simgp.map)
  file(GENERATE OUTPUT ${export_list}
       CONTENT "SIMGP_1 {\n    global:\n        ${exports}$<SEMICOLON>\n    local:\n        *$<SEMICOLON>\n}$<SEMICOLON>\n")
  target_link_options(simgp_shared PRIVATE
    "LINKER:--version-script=${export_list}" "LINKER:-z,max-page-size=16384"
    "LINKER:-z,noexecstack" "LINKER:-z,text" "LINKER:--as-needed")
  if(NOT SIMGP_SANITIZE)
    target_link_options(simgp_shared PRIVATE "LINKER:-z,defs")
  endif()
endif()
set_target_properties(simgp_shared PROPERTIES LINK_DEPENDS ${export_list})
