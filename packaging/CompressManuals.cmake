# SPDX-License-Identifier: MIT
# Run by cpack between installing and packing: manual pages are compressed on Debian.
file(GLOB_RECURSE manuals
    "${CPACK_TEMPORARY_DIRECTORY}/*${CPACK_PACKAGING_INSTALL_PREFIX}/share/man/*")
if(manuals)
    execute_process(COMMAND gzip --no-name --best ${manuals} COMMAND_ERROR_IS_FATAL ANY)
endif()
