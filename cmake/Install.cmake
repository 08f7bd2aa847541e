include(CMakePackageConfigHelpers)

install(TARGETS kestaccel kestcore EXPORT kestaccelTargets
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/include/kestaccel
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
install(DIRECTORY ${PROJECT_SOURCE_DIR}/kestcore/include/kestcore
    DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})

set(KESTACCEL_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/kestaccel)
install(EXPORT kestaccelTargets
    NAMESPACE kestaccel::
    DESTINATION ${KESTACCEL_CMAKE_DIR})

# kestcore's stand-in travels in the same package; its target keeps the
# kestcore:: name that the companion library uses.
configure_package_config_file(
    ${CMAKE_CURRENT_LIST_DIR}/kestaccelConfig.cmake.in
    ${PROJECT_BINARY_DIR}/kestaccelConfig.cmake
    INSTALL_DESTINATION ${KESTACCEL_CMAKE_DIR})
write_basic_package_version_file(
    ${PROJECT_BINARY_DIR}/kestaccelConfigVersion.cmake
    VERSION ${PROJECT_VERSION}
    COMPATIBILITY SameMajorVersion)
install(FILES
    ${PROJECT_BINARY_DIR}/kestaccelConfig.cmake
    ${PROJECT_BINARY_DIR}/kestaccelConfigVersion.cmake
    DESTINATION ${KESTACCEL_CMAKE_DIR})

configure_file(${CMAKE_CURRENT_LIST_DIR}/kestaccel.pc.in ${PROJECT_BINARY_DIR}/kestaccel.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/kestaccel.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)
