# SPDX-FileCopyrightText: 2026 The vornjsondb authors
# SPDX-License-Identifier: MIT
# What is installed: the library, a shared one with its links, the headers, a package for find_package and one for
# pkg-config, the program with its completion, the manual pages and the licence. Both packages can be moved with what
# they belong to.
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(header_folder ${CMAKE_INSTALL_INCLUDEDIR}/vornjsondb)
set(package_folder ${CMAKE_INSTALL_LIBDIR}/cmake/VornJsonDb)

# CMAKE_INSTALL_DOCDIR is the host's own, where this is a part of a host.
set(licence_folder ${CMAKE_INSTALL_DATAROOTDIR}/doc/${PROJECT_NAME})

# The folders that are made are noted beside the manifest of the files.
set(folders ${header_folder} ${package_folder} ${CMAKE_INSTALL_LIBDIR}/pkgconfig
  ${CMAKE_INSTALL_MANDIR}/man3 ${CMAKE_INSTALL_MANDIR}/man7 ${licence_folder})
set(completion_folder ${CMAKE_INSTALL_DATAROOTDIR}/bash-completion/completions)
if(VORNJSONDB_TOOL)
  list(APPEND folders ${CMAKE_INSTALL_BINDIR} ${CMAKE_INSTALL_MANDIR}/man1 ${completion_folder})
endif()
install(CODE "set(folders \"${folders}\")\nset(notes \"${CMAKE_BINARY_DIR}/install_folders.txt\")" ALL_COMPONENTS)
install(SCRIPT cmake/note_folders.cmake ALL_COMPONENTS)

install(TARGETS vornjsondb EXPORT VornJsonDb
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT vornjsondb_runtime
    NAMELINK_COMPONENT vornjsondb_development
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT vornjsondb_development
  INCLUDES DESTINATION ${header_folder})
install(FILES include/VornJsonDbApi.h include/VornJsonTable.h DESTINATION ${header_folder}
  COMPONENT vornjsondb_development)

install(EXPORT VornJsonDb NAMESPACE VornJsonDb:: FILE VornJsonDbTargets.cmake
  DESTINATION ${package_folder} COMPONENT vornjsondb_development)
configure_package_config_file(cmake/VornJsonDbConfig.cmake.in VornJsonDbConfig.cmake
  INSTALL_DESTINATION ${package_folder}
  NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(VornJsonDbConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
  ${CMAKE_CURRENT_BINARY_DIR}/VornJsonDbConfig.cmake
  ${CMAKE_CURRENT_BINARY_DIR}/VornJsonDbConfigVersion.cmake
  DESTINATION ${package_folder} COMPONENT vornjsondb_development)

# Relative to the file itself, which is in LIBDIR/pkgconfig.
file(RELATIVE_PATH prefix_from_pc
  ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
string(REGEX REPLACE "/$" "" prefix_from_pc "${prefix_from_pc}")
foreach(folder IN ITEMS LIBDIR INCLUDEDIR)
  set(pc_${folder} "\${prefix}")
  cmake_path(APPEND pc_${folder} "${CMAKE_INSTALL_${folder}}")  # an absolute one replaces the prefix
endforeach()
configure_file(cmake/vornjsondb.pc.in vornjsondb.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/vornjsondb.pc
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT vornjsondb_development)

install(FILES man/VornJsonDbApi.3 DESTINATION ${CMAKE_INSTALL_MANDIR}/man3
  COMPONENT vornjsondb_development)
install(FILES man/vornjsondb.7 DESTINATION ${CMAKE_INSTALL_MANDIR}/man7
  COMPONENT vornjsondb_development)

if(VORNJSONDB_TOOL)
  install(TARGETS vornjsondb_tool RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT vornjsondb_tools)
  install(FILES man/vornjsondb.1 DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT vornjsondb_tools)
  install(FILES tools/completion/vornjsondb DESTINATION ${completion_folder} COMPONENT vornjsondb_tools)
endif()

install(FILES LICENSE DESTINATION ${licence_folder}
  COMPONENT vornjsondb_runtime)
