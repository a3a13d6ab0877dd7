# SPDX-License-Identifier: MIT
# Writes the header that tells what the program was built from, when it has changed.
# usage: cmake -D SOURCE=FOLDER -D HEADER=FILE -P write-built-from.cmake
execute_process(COMMAND git -C "${SOURCE}" describe --always --dirty --abbrev=12
    OUTPUT_VARIABLE commit OUTPUT_STRIP_TRAILING_WHITESPACE ERROR_QUIET)
file(CONFIGURE OUTPUT "${HEADER}" CONTENT "#define QNS_BUILT_FROM \"${commit}\"\n")
