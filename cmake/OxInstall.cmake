# Installation rules of OxBase, by component:
#   runtime      the shared library and the default message file
#   development  public headers (every folder named detail stays out), the
#                version header, the CMake package and the pkg-config file
#   tools        oxtool and its manual page (tools/oxtool/CMakeLists.txt)
# Everything is relocatable: the CMake package and oxbase.pc find the prefix
# from their own location, and oxtool finds the library and the message file
# from its own.
include(CMakePackageConfigHelpers)

install(TARGETS oxbase EXPORT OxBaseTargets
    LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime
        NAMELINK_COMPONENT development
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT development
    RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT runtime)
install(FILES data/oxbase.msg DESTINATION ${OXBASE_INSTALL_DATA_DIR} COMPONENT runtime)

install(DIRECTORY oxbase/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/oxbase
    COMPONENT development
    FILES_MATCHING PATTERN "*.h"
    PATTERN "detail" EXCLUDE)
# The version header names the data directory under the prefix actually
# installed to (cmake --install --prefix, a package's prefix), so it is
# written again at install time rather than copied from the build tree.
install(CODE "
    set(PROJECT_VERSION \"${PROJECT_VERSION}\")
    set(PROJECT_VERSION_MAJOR \"${PROJECT_VERSION_MAJOR}\")
    set(PROJECT_VERSION_MINOR \"${PROJECT_VERSION_MINOR}\")
    set(PROJECT_VERSION_PATCH \"${PROJECT_VERSION_PATCH}\")
    set(OXBASE_INSTALL_DATA_DIR \"${OXBASE_INSTALL_DATA_DIR}\")
    set(CMAKE_INSTALL_BINDIR \"${CMAKE_INSTALL_BINDIR}\")
    set(OXBASE_DATA_DIR \"\${CMAKE_INSTALL_PREFIX}/${OXBASE_INSTALL_DATA_DIR}\")
    set(_oxbase_header \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_INCLUDEDIR}/oxbase/OxVersion.h\")
    message(STATUS \"Installing: \${_oxbase_header}\")
    configure_file(\"${PROJECT_SOURCE_DIR}/cmake/OxVersion.h.in\" \"\${_oxbase_header}\" @ONLY)
    " COMPONENT development)

install(EXPORT OxBaseTargets NAMESPACE OxBase::
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/OxBase COMPONENT development)
configure_package_config_file(cmake/OxBaseConfig.cmake.in
    ${PROJECT_BINARY_DIR}/OxBaseConfig.cmake
    INSTALL_DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/OxBase
    PATH_VARS OXBASE_INSTALL_DATA_DIR)
write_basic_package_version_file(${PROJECT_BINARY_DIR}/OxBaseConfigVersion.cmake
    COMPATIBILITY SameMajorVersion)
install(FILES ${PROJECT_BINARY_DIR}/OxBaseConfig.cmake
    ${PROJECT_BINARY_DIR}/OxBaseConfigVersion.cmake
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/cmake/OxBase COMPONENT development)

# oxbase.pc: the prefix is found from the file's own directory (${pcfiledir}).
file(RELATIVE_PATH OXBASE_PC_TO_PREFIX
    ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
string(REGEX REPLACE "/$" "" OXBASE_PC_TO_PREFIX "${OXBASE_PC_TO_PREFIX}")
configure_file(cmake/oxbase.pc.in ${PROJECT_BINARY_DIR}/oxbase.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/oxbase.pc
    DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT development)
