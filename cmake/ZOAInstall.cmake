# Install rules: the shared library and the two static ones beside it, the public
# headers, a CMake package (find_package(ZOA CONFIG) gives ZOA::zoa, ZOA::text and
# ZOA::interp) and pkg-config files (zoa, zoa-text, zoa-interp).
include(CMakePackageConfigHelpers)

install(TARGETS zoa zoa_text zoa_interp EXPORT ZOATargets
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

# pkg-config: one file per library, as with other multi-library packages;
# zoa-text and zoa-interp require zoa, so their link lines end in -lZOA.
# The Cflags carry no -std: the headers need C++17, which is what g++ 11 and
# clang 16 and later compile by default, and a forced -std=c++17 would lower a
# user's -std=c++20. (The CMake targets state cxx_std_17 as a minimum instead.)
# The prefix is found from the file's own place, so the tree can be moved.
file(RELATIVE_PATH ZOA_PC_TO_PREFIX /${CMAKE_INSTALL_LIBDIR}/pkgconfig /)
string(REGEX REPLACE "/$" "" ZOA_PC_TO_PREFIX "${ZOA_PC_TO_PREFIX}")
configure_file(${PROJECT_SOURCE_DIR}/cmake/zoa.pc.in ${PROJECT_BINARY_DIR}/pkgconfig/zoa.pc @ONLY)
foreach(part text interp)
  set(ZOA_PC_PART ${part})
  set(ZOA_PC_LIB ZOA_${part})
  if(part STREQUAL "text")
    set(ZOA_PC_DESCRIPTION "libZOA's text form (zoa/text.h) and verifier (zoa/verify.h)")
  else()
    set(ZOA_PC_DESCRIPTION "libZOA's interpreter (zoa/interp.h)")
  endif()
  configure_file(${PROJECT_SOURCE_DIR}/cmake/zoa-lib.pc.in ${PROJECT_BINARY_DIR}/pkgconfig/zoa-${part}.pc @ONLY)
endforeach()
install(FILES ${PROJECT_BINARY_DIR}/pkgconfig/zoa.pc ${PROJECT_BINARY_DIR}/pkgconfig/zoa-text.pc
  ${PROJECT_BINARY_DIR}/pkgconfig/zoa-interp.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
