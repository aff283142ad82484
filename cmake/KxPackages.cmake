# What cpack makes: Debian packages, one for each component. The package preset builds what goes into them.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_CONTACT "KX_XMLConfigParser maintainers <maintainers@localhost>" CACHE STRING
    "Maintainer of the packages")
set(CPACK_STRIP_FILES ON)

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_SECTION libs)
set(CPACK_DEBIAN_PACKAGE_PRIORITY optional)

# What Debian's policy asks for and cpack does not make by itself.
set(CPACK_KX_CHANGELOG ${PROJECT_SOURCE_DIR}/CHANGELOG.md)
set(CPACK_PRE_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/cmake/packages/AddPolicyFiles.cmake)
set(CPACK_POST_BUILD_SCRIPTS ${PROJECT_SOURCE_DIR}/cmake/packages/DropLdconfigScripts.cmake)

# Dependencies are read off the binaries; the project's own libraries are found in the build folder.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${PROJECT_BINARY_DIR}/src ${PROJECT_BINARY_DIR}/platform)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")

# kx_describe_package(<component> <synopsis> <contents>): the text that package managers show. An empty summary
# keeps cpack from putting its own in front.
set(CPACK_PACKAGE_DESCRIPTION_SUMMARY "")
function(kx_describe_package component synopsis contents)
    set(CPACK_DEBIAN_${component}_DESCRIPTION "${synopsis}
Reads and changes values of an XML configuration file by key path, such as
gateway.network.interface@name=eth1.address. A document toolkit gives access to
the whole document, with XPath queries. Built on libxml2.

${contents}" PARENT_SCOPE)
endfunction()

set(runtime_package libkx-xmlconfigparser${PROJECT_VERSION_MAJOR})
set(CPACK_DEBIAN_RUNTIME_PACKAGE_NAME ${runtime_package})
set(CPACK_DEBIAN_RUNTIME_PACKAGE_CONTROL_EXTRA ${PROJECT_SOURCE_DIR}/cmake/packages/triggers)
kx_describe_package(RUNTIME "access to XML configuration files by key path"
    "This package contains the shared libraries.")

set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_NAME libkx-xmlconfigparser-dev)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_DEPENDS "${runtime_package} (= ${PROJECT_VERSION})")
set(CPACK_DEBIAN_DEVELOPMENT_PACKAGE_SUGGESTS libxml2-dev)
kx_describe_package(DEVELOPMENT "access to XML configuration files by key path (development)"
    "This package contains the headers, the CMake package and the pkg-config file.")

set(CPACK_DEBIAN_TOOLS_PACKAGE_NAME kxconfig)
set(CPACK_DEBIAN_TOOLS_PACKAGE_SECTION utils)
set(CPACK_DEBIAN_TOOLS_PACKAGE_DEPENDS "${runtime_package} (>= ${PROJECT_VERSION})")
kx_describe_package(TOOLS "access to XML configuration files by key path (command line)"
    "This package contains the command-line client.")

include(CPack)
