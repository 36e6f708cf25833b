# What `cmake --install` gives a host: the library, its headers, a CMake package and a pkg-config
# file. The component `library` is what a compiled host needs, `development` what compiling one needs
# beside it.
include(CMakePackageConfigHelpers)
set(CMAKE_INSTALL_DEFAULT_COMPONENT_NAME development)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/wordcatcher)

install(TARGETS wordcatcher EXPORT wordcatcherTargets
  LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT library NAMELINK_COMPONENT development
  FILE_SET HEADERS DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}
  FILE_SET generated_headers DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(EXPORT wordcatcherTargets NAMESPACE wordcatcher:: DESTINATION ${package_dir})

configure_package_config_file(cmake/wordcatcherConfig.cmake.in wordcatcherConfig.cmake
  INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(wordcatcherConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
  ${PROJECT_BINARY_DIR}/wordcatcherConfig.cmake
  ${PROJECT_BINARY_DIR}/wordcatcherConfigVersion.cmake
  DESTINATION ${package_dir})

# The paths in the .pc file hang on its own place, so that an install into any prefix works, also
# after the tree was moved.
file(RELATIVE_PATH pc_to_prefix
  /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
configure_file(cmake/wordcatcher.pc.in wordcatcher.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/wordcatcher.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
