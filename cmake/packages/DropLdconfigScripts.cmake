# Run by cpack on the packages that it made: removes the scripts that it adds to a package with a shared library.
# They call ldconfig, which a trigger does, once for all packages of an installation.
set(contents ${CPACK_TEMPORARY_DIRECTORY}/repacked)

foreach(package ${CPACK_PACKAGE_FILES})
    file(REMOVE_RECURSE ${contents})
    execute_process(COMMAND dpkg-deb --raw-extract ${package} ${contents} COMMAND_ERROR_IS_FATAL ANY)
    file(REMOVE ${contents}/DEBIAN/postinst ${contents}/DEBIAN/postrm)
    execute_process(COMMAND dpkg-deb --root-owner-group --build ${contents} ${package}
        OUTPUT_QUIET COMMAND_ERROR_IS_FATAL ANY)
endforeach()
file(REMOVE_RECURSE ${contents})
