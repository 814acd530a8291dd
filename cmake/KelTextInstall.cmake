# The package an embedder installs: the libraries, their public headers, the CMake package
# (find_package(KelText) gives keltext::controls and keltext::minihost) and keltext.pc for
# builds that use pkg-config.
include(CMakePackageConfigHelpers)

set(KELTEXT_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/KelText)
install(TARGETS ${KELTEXT_EXPORTED_TARGETS} EXPORT KelTextTargets
  ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development)
install(EXPORT KelTextTargets NAMESPACE keltext:: DESTINATION ${KELTEXT_CMAKE_DIR} COMPONENT development)
# The Qt host: find_package(KelText COMPONENTS Qt) gives keltext::qt and finds Qt 6 Widgets.
if(TARGET keltext_qt)
  set(KELTEXT_HAS_QT ON)
  install(TARGETS keltext_qt EXPORT KelTextQtTargets
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT development)
  install(EXPORT KelTextQtTargets NAMESPACE keltext:: DESTINATION ${KELTEXT_CMAKE_DIR} COMPONENT development)
else()
  set(KELTEXT_HAS_QT OFF)
endif()
configure_package_config_file(${PROJECT_SOURCE_DIR}/cmake/KelTextConfig.cmake.in
  ${PROJECT_BINARY_DIR}/KelTextConfig.cmake
  INSTALL_DESTINATION ${KELTEXT_CMAKE_DIR})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/KelTextConfigVersion.cmake
  COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/KelTextConfig.cmake ${PROJECT_BINARY_DIR}/KelTextConfigVersion.cmake
  DESTINATION ${KELTEXT_CMAKE_DIR} COMPONENT development)

# keltext.pc finds its prefix from where it lies (${pcfiledir}), so that an installation
# moved elsewhere, or made with `cmake --install --prefix`, still points at its own files.
set(KELTEXT_PC_DIR ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
if(IS_ABSOLUTE ${CMAKE_INSTALL_LIBDIR} OR IS_ABSOLUTE ${CMAKE_INSTALL_INCLUDEDIR})
  set(KELTEXT_PC_PREFIX ${CMAKE_INSTALL_PREFIX})
else()
  file(RELATIVE_PATH pc_to_prefix /root/${KELTEXT_PC_DIR} /root)
  set(KELTEXT_PC_PREFIX "\${pcfiledir}/${pc_to_prefix}")
endif()
foreach(dir LIBDIR INCLUDEDIR)
  if(IS_ABSOLUTE ${CMAKE_INSTALL_${dir}})
    set(KELTEXT_PC_${dir} ${CMAKE_INSTALL_${dir}})
  else()
    set(KELTEXT_PC_${dir} "\${prefix}/${CMAKE_INSTALL_${dir}}")
  endif()
endforeach()
configure_file(${PROJECT_SOURCE_DIR}/cmake/keltext.pc.in ${PROJECT_BINARY_DIR}/keltext.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/keltext.pc DESTINATION ${KELTEXT_PC_DIR} COMPONENT development)
install(FILES ${PROJECT_SOURCE_DIR}/LICENSE DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/keltext COMPONENT development)
