include(GNUInstallDirs)
include(CMakePackageConfigHelpers)

install(TARGETS ${KELTEXT_EXPORTED_TARGETS} keltext_flags EXPORT KelTextTargets
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR}
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
  INCLUDES DESTINATION include)
install(EXPORT KelTextTargets NAMESPACE keltext:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/KelText)
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/KelTextConfig.cmake.in
  ${PROJECT_BINARY_DIR}/KelTextConfig.cmake
  INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/KelText)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/KelTextConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/KelTextConfig.cmake ${PROJECT_BINARY_DIR}/KelTextConfigVersion.cmake
  DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/KelText)
