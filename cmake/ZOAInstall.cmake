# Install rules: the shared library, the public headers, a CMake package
# (find_package(ZOA CONFIG) gives ZOA::zoa) and a pkg-config file.
include(CMakePackageConfigHelpers)

install(TARGETS zoa zoa_verify zoa_text zoa_interp EXPORT ZOATargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR}
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
  INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/include/zoa DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})

set(ZOA_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/ZOA)
install(EXPORT ZOATargets NAMESPACE ZOA:: DESTINATION ${ZOA_CMAKE_DIR})
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/ZOAConfig.cmake.in
  ${PROJECT_BINARY_DIR}/ZOAConfig.cmake INSTALL_DESTINATION ${ZOA_CMAKE_DIR})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/ZOAConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/ZOAConfig.cmake ${PROJECT_BINARY_DIR}/ZOAConfigVersion.cmake
  DESTINATION ${ZOA_CMAKE_DIR})

configure_file(${PROJECT_SOURCE_DIR}/cmake/zoa.pc.in ${PROJECT_BINARY_DIR}/zoa.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/zoa.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
