# What `make install` puts where, under the prefix:
#   lib/tcltk/kelmar<version>/    the package, the component libraries it loads and the tool, with
#                                 pkgIndex.tcl; a stock tclsh8.6 searches lib/tcltk of /usr/local
#                                 and of /usr. The libraries find each other by RPATH $ORIGIN and
#                                 the factory loads component libraries from this folder.
#   bin/kelmarsh                  the shell
#   include/kelmar/               the interface headers
#   lib/cmake/Kelmar/             find_package(Kelmar): imported targets Kelmar::<library>
#   lib/pkgconfig/kelmar.pc       the same for pkg-config
# The test kit is built for the tests and is not installed. Everything is placed relative to the
# prefix, so `cmake --install --prefix` may choose it at install time.
include(CMakePackageConfigHelpers)

set(KELMAR_INSTALL_PACKAGE_DIR lib/tcltk/kelmar${PROJECT_VERSION})
set(KELMAR_INSTALL_INCLUDE_DIR include/kelmar)
set(KELMAR_INSTALL_CMAKE_DIR lib/cmake/Kelmar)

# What a C++ implementer links, and the package itself; the tool is loaded by Tcl only.
set(KELMAR_EXPORTED_LIBRARIES PortBase KelmarPkg Tcltask_Support ArgMatchKit TcltaskI_Morvane)
set(KELMAR_INSTALLED_LIBRARIES ${KELMAR_EXPORTED_LIBRARIES})
if(TARGET KelmarTool)
  list(APPEND KELMAR_INSTALLED_LIBRARIES KelmarTool)
endif()
set_target_properties(${KELMAR_INSTALLED_LIBRARIES} PROPERTIES INSTALL_RPATH "\$ORIGIN")

install(TARGETS ${KELMAR_EXPORTED_LIBRARIES} EXPORT KelmarTargets
  LIBRARY DESTINATION ${KELMAR_INSTALL_PACKAGE_DIR})
if(TARGET KelmarTool)
  install(TARGETS KelmarTool LIBRARY DESTINATION ${KELMAR_INSTALL_PACKAGE_DIR})
  install(FILES ${KELMAR_LIB_DIR}/kelmartool_report.tcl ${KELMAR_LIB_DIR}/kelmartool_show.tcl
    ${KELMAR_LIB_DIR}/kelmartool_synth.tcl ${KELMAR_LIB_DIR}/kelmartool_delays.json DESTINATION ${KELMAR_INSTALL_PACKAGE_DIR})
endif()
install(FILES ${KELMAR_LIB_DIR}/pkgIndex.tcl DESTINATION ${KELMAR_INSTALL_PACKAGE_DIR})
if(TARGET kelmarsh)
  install(TARGETS kelmarsh RUNTIME DESTINATION bin)
endif()
install(DIRECTORY ${CMAKE_SOURCE_DIR}/include/ DESTINATION ${KELMAR_INSTALL_INCLUDE_DIR}
  FILES_MATCHING PATTERN "*.h")

install(EXPORT KelmarTargets NAMESPACE Kelmar:: DESTINATION ${KELMAR_INSTALL_CMAKE_DIR})
configure_package_config_file(${CMAKE_SOURCE_DIR}/cmake/KelmarConfig.cmake.in
  ${CMAKE_BINARY_DIR}/KelmarConfig.cmake INSTALL_DESTINATION ${KELMAR_INSTALL_CMAKE_DIR}
  PATH_VARS KELMAR_INSTALL_PACKAGE_DIR)
# The libraries of one version are built together: another minor version is another interface.
write_basic_package_version_file(${CMAKE_BINARY_DIR}/KelmarConfigVersion.cmake COMPATIBILITY SameMinorVersion)
install(FILES ${CMAKE_BINARY_DIR}/KelmarConfig.cmake ${CMAKE_BINARY_DIR}/KelmarConfigVersion.cmake
  DESTINATION ${KELMAR_INSTALL_CMAKE_DIR})

configure_file(${CMAKE_SOURCE_DIR}/cmake/kelmar.pc.in ${CMAKE_BINARY_DIR}/kelmar.pc @ONLY)
install(FILES ${CMAKE_BINARY_DIR}/kelmar.pc DESTINATION lib/pkgconfig)

# make uninstall: removes the files of install_manifest.txt (or of MANIFEST), then the folders above
# that are the project's own, once empty.
configure_file(${CMAKE_SOURCE_DIR}/cmake/uninstall.cmake.in ${CMAKE_BINARY_DIR}/uninstall.cmake @ONLY)
