# What `cmake --install` gives: headers, the library, a CMake package and a pkg-config file; tools install themselves.
# Three parts, which packages are made of: `runtime`, `development` and `tools`.
include(CMakePackageConfigHelpers)

# The list that an installation leaves here may be root's, and the next installation somebody else's.
install(CODE "file(REMOVE \"${PROJECT_BINARY_DIR}/install_manifest.txt\")")

set(TESSELLA_PACKAGE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/tessella)

install(TARGETS tessella EXPORT tessellaTargets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime NAMELINK_COMPONENT development)
# Found beside the library that needs it; nobody else links it.
install(TARGETS tessella_bundle EXPORT tessellaTargets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime NAMELINK_SKIP)
install(FILES include/tessella.h DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT development)
install(DIRECTORY include/tessella DESTINATION ${CMAKE_INSTALL_INCLUDEDIR} COMPONENT development
    FILES_MATCHING PATTERN "*.h")

install(EXPORT tessellaTargets NAMESPACE tessella:: DESTINATION ${TESSELLA_PACKAGE_DIR} COMPONENT development)
# Whoever has no tools can do without them.
install(EXPORT tessellaToolTargets NAMESPACE tessella:: DESTINATION ${TESSELLA_PACKAGE_DIR} COMPONENT tools)
configure_package_config_file(cmake/tessellaConfig.cmake.in ${PROJECT_BINARY_DIR}/tessellaConfig.cmake
    INSTALL_DESTINATION ${TESSELLA_PACKAGE_DIR})
write_basic_package_version_file(${PROJECT_BINARY_DIR}/tessellaConfigVersion.cmake
    COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/tessellaConfig.cmake ${PROJECT_BINARY_DIR}/tessellaConfigVersion.cmake
    cmake/TessellaConsoleTest.cmake
    DESTINATION ${TESSELLA_PACKAGE_DIR} COMPONENT development)

# The folders from the .pc file's own, so that a tree installed with another prefix, or moved, still works.
file(RELATIVE_PATH TESSELLA_PC_TO_PREFIX
    ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
configure_file(cmake/tessella.pc.in ${PROJECT_BINARY_DIR}/tessella.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/tessella.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT development)
