# What cmake --install puts where. Components: runtime (the libraries), development (what a client is built
# with), tools (kxconfig).
include(CMakePackageConfigHelpers)

set(package_dir ${CMAKE_INSTALL_LIBDIR}/cmake/${PROJECT_NAME})
set(pkgconfig_dir ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

# kx_install_library(<target> <folder of headers>): both for the export that the package config reads
function(kx_install_library target headers)
    install(TARGETS ${target} EXPORT ${PROJECT_NAME}Targets
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT runtime NAMELINK_COMPONENT development
        INCLUDES DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/${target})
    install(DIRECTORY ${headers}/ DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/${target}
        COMPONENT development FILES_MATCHING PATTERN "*.h")
endfunction()

kx_install_library(KX_XMLConfigParser ${PROJECT_SOURCE_DIR}/include)

# A real platform brings its own headers and libraries; clients find them where this build did.
if(KX_PLATFORM STREQUAL "external")
    install(TARGETS KX_Platform EXPORT ${PROJECT_NAME}Targets)
    string(REPLACE ";" " " pc_platform_libs "${KX_PLATFORM_LIBRARIES}")
    set(pc_platform_cflags -I${KX_PLATFORM_INCLUDE_DIR})
else()
    kx_install_library(KX_Platform ${PROJECT_SOURCE_DIR}/platform/include)
    set(pc_platform_libs -lKX_Platform)
    set(pc_platform_cflags -I\${includedir}/KX_Platform)
endif()

install(EXPORT ${PROJECT_NAME}Targets NAMESPACE KX:: DESTINATION ${package_dir} COMPONENT development)
configure_package_config_file(cmake/${PROJECT_NAME}Config.cmake.in ${PROJECT_NAME}Config.cmake
    INSTALL_DESTINATION ${package_dir} NO_SET_AND_CHECK_MACRO)
write_basic_package_version_file(${PROJECT_NAME}ConfigVersion.cmake COMPATIBILITY SameMajorVersion)
install(FILES
    ${PROJECT_BINARY_DIR}/${PROJECT_NAME}Config.cmake
    ${PROJECT_BINARY_DIR}/${PROJECT_NAME}ConfigVersion.cmake
    DESTINATION ${package_dir} COMPONENT development)

# The file derives the prefix from its own location, so that it is valid in any prefix and in a staged one.
file(RELATIVE_PATH pc_to_prefix ${CMAKE_INSTALL_FULL_LIBDIR}/pkgconfig ${CMAKE_INSTALL_PREFIX})
string(REGEX REPLACE "/$" "" pc_to_prefix "${pc_to_prefix}")
file(RELATIVE_PATH pc_libdir ${CMAKE_INSTALL_PREFIX} ${CMAKE_INSTALL_FULL_LIBDIR})
file(RELATIVE_PATH pc_includedir ${CMAKE_INSTALL_PREFIX} ${CMAKE_INSTALL_FULL_INCLUDEDIR})
configure_file(cmake/${PROJECT_NAME}.pc.in ${PROJECT_NAME}.pc @ONLY)
install(FILES ${PROJECT_BINARY_DIR}/${PROJECT_NAME}.pc DESTINATION ${pkgconfig_dir} COMPONENT development)

install(FILES ${PROJECT_SOURCE_DIR}/CHANGELOG.md DESTINATION ${CMAKE_INSTALL_DOCDIR} COMPONENT runtime)

if(KX_BUILD_TOOLS)
    install(TARGETS kxconfig DESTINATION ${CMAKE_INSTALL_BINDIR} COMPONENT tools)
    install(FILES tools/completion/kxconfig.bash
        DESTINATION ${CMAKE_INSTALL_DATADIR}/bash-completion/completions RENAME kxconfig COMPONENT tools)
    # zsh itself looks below each prefix in site-functions, but the packages of Debian have a folder of their own.
    if(CMAKE_INSTALL_PREFIX STREQUAL "/usr")
        set(zsh_folder vendor-completions)
    else()
        set(zsh_folder site-functions)
    endif()
    install(FILES tools/completion/kxconfig.zsh
        DESTINATION ${CMAKE_INSTALL_DATADIR}/zsh/${zsh_folder} RENAME _kxconfig COMPONENT tools)
    install(FILES tools/completion/kxconfig.fish
        DESTINATION ${CMAKE_INSTALL_DATADIR}/fish/vendor_completions.d COMPONENT tools)
    install(FILES ${PROJECT_BINARY_DIR}/kxconfig.1 DESTINATION ${CMAKE_INSTALL_MANDIR}/man1 COMPONENT tools)
endif()
