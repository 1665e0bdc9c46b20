# What `cmake --install` lays down: headers, both libraries, a CMake package and a pkg-config file.
include(CMakePackageConfigHelpers)

install(TARGETS tavir_shared tavir_static EXPORT TavirSlideShowTargets
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(DIRECTORY include/tavirpelo include/slideshow DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(EXPORT TavirSlideShowTargets NAMESPACE TavirSlideShow::
        DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/TavirSlideShow)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/TavirSlideShow)
configure_package_config_file(cmake/TavirSlideShowConfig.cmake.in TavirSlideShowConfig.cmake
                              INSTALL_DESTINATION ${package_dir})
write_basic_package_version_file(TavirSlideShowConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/TavirSlideShowConfig.cmake
              ${PROJECT_BINARY_DIR}/TavirSlideShowConfigVersion.cmake
        DESTINATION ${package_dir})

# The pkg-config files find the prefix from where they stand, so that a tree may be moved.
file(RELATIVE_PATH TAVIR_PC_PREFIX "/${CMAKE_INSTALL_LIBDIR}/pkgconfig" "/")
foreach(name TavirSlideShow TavirSlideShow-static)
  configure_file(cmake/${name}.pc.in ${name}.pc @ONLY)
  install(FILES ${PROJECT_BINARY_DIR}/${name}.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
endforeach()
