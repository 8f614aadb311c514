# Debian packages by CPack (cpack -G DEB in a build directory), one per
# installation component:
#   liboxbase<MAJOR>  runtime: the shared library and the message file
#   liboxbase-dev     development: headers, CMake package, pkg-config file
#   oxbase-tools      tools: oxtool and its manual page
# The development and tool packages depend on the runtime package of the same
# version; the runtime package's own dependencies come from dpkg-shlibdeps.
set(CPACK_PACKAGE_NAME oxbase)
set(CPACK_PACKAGE_VENDOR "OxBase")
set(CPACK_PACKAGE_CONTACT "OxBase developers <oxbase-dev@localhost>")
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "Foundation library of a CAD data translator")
set(CPACK_PACKAGE_VERSION ${PROJECT_VERSION})
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_SET_DESTDIR ON)
set(CPACK_INSTALL_PREFIX /usr)
set(CPACK_COMPONENTS_ALL runtime development tools)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_ENABLE_COMPONENT_DEPENDS ON)

set(CPACK_COMPONENT_RUNTIME_DESCRIPTION
    "OxBase shared library and default message file")
set(CPACK_COMPONENT_DEVELOPMENT_DESCRIPTION
    "OxBase headers, CMake package and pkg-config file")
set(CPACK_COMPONENT_TOOLS_DESCRIPTION "oxtool, the OxBase document checker and demo")
set(CPACK_COMPONENT_DEVELOPMENT_DEPENDS runtime)
set(CPACK_COMPONENT_TOOLS_DEPENDS runtime)

set(CPACK_DEBIAN_RUNTIME_PACKAGE_NAME liboxbase${PROJECT_VERSION_MAJOR})
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_RUNTIME_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME liboxbase-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_TOOLS_PACKAGE_NAME oxbase-tools)
set(CPACK_DEBIAN_TOOLS_PACKAGE_SECTION utils)
# oxtool links the runtime package's library, which dpkg-shlibdeps cannot
# attribute to an installed package while it is built: its C and C++ runtime
# are named here, the runtime package comes from the component dependency.
set(CPACK_DEBIAN_TOOLS_PACKAGE_DEPENDS "libc6, libstdc++6, libgcc-s1")

include(CPack)
