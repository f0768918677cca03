# Installation: headers (with the generated .pb.h and the .proto files), the shared libraries,
# the static archive, the tools, the sample tuning set, the CMake package `tavik` and a
# pkg-config file.

include(CMakePackageConfigHelpers)

set(TAVIK_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/tavik)

install(TARGETS tavik_base tavik_iq_zel tavik_iq_zel_static
  EXPORT tavikTargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR}
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
  INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})

install(DIRECTORY ${PROJECT_SOURCE_DIR}/tavik/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/tavik
  FILES_MATCHING PATTERN "*.h" PATTERN "*.proto"
  PATTERN "testing" EXCLUDE PATTERN "internal" EXCLUDE)
install(DIRECTORY ${TAVIK_GENERATED_DIR}/tavik/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/tavik
  FILES_MATCHING PATTERN "*.pb.h")

install(EXPORT tavikTargets NAMESPACE tavik:: DESTINATION ${TAVIK_CMAKE_DIR})
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/tavikConfig.cmake.in
  ${PROJECT_BINARY_DIR}/tavikConfig.cmake INSTALL_DESTINATION ${TAVIK_CMAKE_DIR})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/tavikConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES
  ${PROJECT_BINARY_DIR}/tavikConfig.cmake
  ${PROJECT_BINARY_DIR}/tavikConfigVersion.cmake
  ${PROJECT_SOURCE_DIR}/cmake/FindAndroidBase.cmake
  DESTINATION ${TAVIK_CMAKE_DIR})

configure_file(${PROJECT_SOURCE_DIR}/cmake/tavik.pc.in ${PROJECT_BINARY_DIR}/tavik.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/tavik.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
