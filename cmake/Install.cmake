# Installs the four libraries, the public headers of the library and of the platform,
# a CMake package (find_package(QZScoring CONFIG) -> QZScoring::scoring) and qzscoring.pc.
include(CMakePackageConfigHelpers)

set(qz_config_dir ${CMAKE_INSTALL_LIBDIR}/cmake/QZScoring)
set(qz_header_dir ${CMAKE_INSTALL_INCLUDEDIR}/qzscoring)

install(TARGETS qzcommon qzparsexml qztransform qzscoring
  EXPORT QZScoringTargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})

# Public headers only: internal headers live beside their sources under src/.
install(DIRECTORY ${PROJECT_SOURCE_DIR}/include/ ${PROJECT_SOURCE_DIR}/platform/include/
  DESTINATION ${qz_header_dir}
  FILES_MATCHING PATTERN "*.h")

install(EXPORT QZScoringTargets
  NAMESPACE QZScoring::
  DESTINATION ${qz_config_dir})

configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/QZScoringConfig.cmake.in
  ${PROJECT_BINARY_DIR}/QZScoringConfig.cmake
  INSTALL_DESTINATION ${qz_config_dir})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/QZScoringConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
# The .pc file finds its prefix from its own place, so the tree may be installed anywhere.
file(RELATIVE_PATH qz_pc_to_prefix "/p/${CMAKE_INSTALL_LIBDIR}/pkgconfig" "/p")
configure_file(${PROJECT_SOURCE_DIR}/cmake/qzscoring.pc.in
  ${PROJECT_BINARY_DIR}/qzscoring.pc @ONLY)

install(FILES
  ${PROJECT_BINARY_DIR}/QZScoringConfig.cmake
  ${PROJECT_BINARY_DIR}/QZScoringConfigVersion.cmake
  DESTINATION ${qz_config_dir})
install(FILES ${PROJECT_BINARY_DIR}/qzscoring.pc
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
