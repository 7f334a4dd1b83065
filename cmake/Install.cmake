# What `cmake --install` puts where, the CMake package and the pkg-config file for
# host programs of one's own, and the Debian package CPack makes of it all.
#
#   bin/zrdict
#   lib/libzrutil.so lib/libzrapi.so     the host libraries
#   lib/libzrbxmls.so                    the plug-in, where an installed zrdict looks
#   include/zrbxmls/*.h                  the host API
#   lib/cmake/zrbxmls/                   find_package(zrbxmls): zrbxmls::zrapi,
#                                        zrbxmls::zrutil, zrbxmls::plugin
#   lib/pkgconfig/zrbxmls.pc
#   share/zrbxmls/examples/*.xsd
include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

set(ZR_INSTALL_CMAKEDIR ${CMAKE_INSTALL_LIBDIR}/cmake/zrbxmls)
set(ZR_INSTALL_INCLUDEDIR ${CMAKE_INSTALL_INCLUDEDIR}/zrbxmls)

# Installed programs and libraries find each other relative to where they are, so an
# installation works wherever it is put (a staging folder, /usr, /opt/...).
file(RELATIVE_PATH ZR_BIN_TO_LIB ${CMAKE_INSTALL_FULL_BINDIR} ${CMAKE_INSTALL_FULL_LIBDIR})
set_target_properties(zrdict PROPERTIES INSTALL_RPATH "$ORIGIN/${ZR_BIN_TO_LIB}")
set_target_properties(zrutil zrapi zrbxmls PROPERTIES INSTALL_RPATH "$ORIGIN")
# A host program loads the plug-in by path; it never links it.
set_target_properties(zrbxmls PROPERTIES EXPORT_NAME plugin)

target_include_directories(zrutil INTERFACE $<INSTALL_INTERFACE:${ZR_INSTALL_INCLUDEDIR}>)
install(TARGETS zrutil zrapi zrbxmls EXPORT zrbxmlsTargets
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(TARGETS zrdict RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR})
install(FILES
        ${CMAKE_SOURCE_DIR}/host/zrtypes.h ${CMAKE_SOURCE_DIR}/host/zrstring.h
        ${CMAKE_SOURCE_DIR}/host/zrdtype.h ${CMAKE_SOURCE_DIR}/host/api/zrapi.h
        ${CMAKE_SOURCE_DIR}/host/zrglob.h ${CMAKE_SOURCE_DIR}/host/zrfile.h
        DESTINATION ${ZR_INSTALL_INCLUDEDIR})
file(GLOB ZR_EXAMPLE_SCHEMAS ${CMAKE_SOURCE_DIR}/examples/*.xsd)
install(FILES ${ZR_EXAMPLE_SCHEMAS} DESTINATION ${CMAKE_INSTALL_DATADIR}/zrbxmls/examples)

install(EXPORT zrbxmlsTargets NAMESPACE zrbxmls:: DESTINATION ${ZR_INSTALL_CMAKEDIR})
configure_package_config_file(${CMAKE_CURRENT_LIST_DIR}/zrbxmlsConfig.cmake.in
  ${CMAKE_BINARY_DIR}/zrbxmlsConfig.cmake INSTALL_DESTINATION ${ZR_INSTALL_CMAKEDIR})
# Before 1.0 a minor version may change the host API.
write_basic_package_version_file(${CMAKE_BINARY_DIR}/zrbxmlsConfigVersion.cmake
  COMPATIBILITY SameMinorVersion)
install(FILES ${CMAKE_BINARY_DIR}/zrbxmlsConfig.cmake ${CMAKE_BINARY_DIR}/zrbxmlsConfigVersion.cmake
        DESTINATION ${ZR_INSTALL_CMAKEDIR})

# The .pc file names its prefix relative to itself, like the CMake package.
file(RELATIVE_PATH ZR_PC_TO_PREFIX ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
string(REGEX REPLACE "/$" "" ZR_PC_TO_PREFIX "${ZR_PC_TO_PREFIX}")
configure_file(${CMAKE_CURRENT_LIST_DIR}/zrbxmls.pc.in ${CMAKE_BINARY_DIR}/zrbxmls.pc @ONLY)
install(FILES ${CMAKE_BINARY_DIR}/zrbxmls.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

# cpack -G DEB (in the build folder): one package with everything above under /usr.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME zrbxmls)
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY
  "XML Schema dictionary plug-in for a record-oriented data-integration engine")
set(CPACK_PACKAGE_DESCRIPTION
  "zrbxmls reads XML Schema documents into record dictionaries. The package holds the\n\
plug-in, the host libraries and headers it is used through, and zrdict, a command-line\n\
host that prints the records of a schema as tables, JSON, a tree or a Graphviz graph.")
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_STRIP_FILES ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_MAINTAINER "zrbxmls developers <zrbxmls@localhost>")
set(CPACK_DEBIAN_PACKAGE_SECTION libs)
# dpkg-shlibdeps names the packages of the libraries the programs need (the
# Xerces-C runtime among them), with the versions they were built against.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
include(CPack)
