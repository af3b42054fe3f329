# Installation: headers, libraries, a CMake package config (tarnstats::tarnstats) and a pkg-config
# file.
include(CMakePackageConfigHelpers)

install(DIRECTORY include/tarnstats DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
if(EXISTS ${CMAKE_CURRENT_BINARY_DIR}/generated/include/tarnstats OR TARGET tarnstats_schema_gen)
  install(DIRECTORY ${CMAKE_CURRENT_BINARY_DIR}/generated/include/tarnstats DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
endif()

if(TARNSTATS_BUNDLED_PLATFORM)
  install(DIRECTORY platform/plinth/include/Plinth platform/tarnctl/include/TarnCtl platform/tarnctl/include/Keel
          DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
  install(TARGETS tarnstats plinth tarnctl EXPORT tarnstatsTargets
          LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
          INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
  install(EXPORT tarnstatsTargets NAMESPACE tarnstats:: DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/tarnstats)
  configure_package_config_file(cmake/tarnstatsConfig.cmake.in ${CMAKE_CURRENT_BINARY_DIR}/tarnstatsConfig.cmake
                                INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/tarnstats)
  write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/tarnstatsConfigVersion.cmake
                                   COMPATIBILITY SameMajorVersion)
  install(FILES ${CMAKE_CURRENT_BINARY_DIR}/tarnstatsConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/tarnstatsConfigVersion.cmake
          DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/tarnstats)
else()
  install(TARGETS tarnstats LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR})
endif()

configure_file(cmake/tarnstats.pc.in ${CMAKE_CURRENT_BINARY_DIR}/tarnstats.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/tarnstats.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
