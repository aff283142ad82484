# Run by cpack on the installed files before it packs them: adds what Debian's policy asks of a package and a plain
# installation does without, a changelog in Debian's format and compressed man pages. The changelog's one entry is
# generated, with an address that does not exist.
set(version "${CPACK_PACKAGE_VERSION}")
file(TIMESTAMP ${CPACK_KX_CHANGELOG} date "%a, %d %b %Y %H:%M:%S +0000" UTC)

function(compress file)
    execute_process(COMMAND gzip -9nf ${file} COMMAND_ERROR_IS_FATAL ANY)
endfunction()

foreach(component ${CPACK_COMPONENTS_ALL})
    string(TOUPPER ${component} upper)
    set(package ${CPACK_DEBIAN_${upper}_PACKAGE_NAME})
    set(share ${CPACK_TEMPORARY_DIRECTORY}/${component}${CPACK_PACKAGING_INSTALL_PREFIX}/share)

    configure_file(${CMAKE_CURRENT_LIST_DIR}/changelog.in ${share}/doc/${package}/changelog @ONLY)
    compress(${share}/doc/${package}/changelog)

    file(GLOB man_pages ${share}/man/man?/*.?)
    foreach(page ${man_pages})
        compress(${page})
    endforeach()
endforeach()
