# SPDX-License-Identifier: MIT
# Language level, warnings, sanitizers and output folders, the same for every target.

option(QNS_BUILD_TESTS "Build the tests" ON)
option(QNS_BUILD_BENCH "Build qnsmedia-bench" OFF)
option(QNS_BUILD_FUZZERS "Build the libFuzzer targets (clang only)" OFF)
option(QNS_COVERAGE "Count what of the code is reached (clang only)" OFF)
set(QNS_SANITIZE "" CACHE STRING "Sanitizers for the whole build, as for -fsanitize=")

set(CMAKE_CXX_STANDARD 17)
set(CMAKE_CXX_STANDARD_REQUIRED ON)
set(CMAKE_CXX_EXTENSIONS OFF)
set(CMAKE_C_STANDARD 11)
set(CMAKE_EXPORT_COMPILE_COMMANDS ON)
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(CMAKE_CXX_VISIBILITY_PRESET hidden)
set(CMAKE_C_VISIBILITY_PRESET hidden)
set(CMAKE_VISIBILITY_INLINES_HIDDEN ON)

# The build tree has the layout of an installation, so that a daemon run from it
# finds its libraries and its share/ folder just as an installed one does.
set(CMAKE_RUNTIME_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/bin")
set(CMAKE_LIBRARY_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/lib")
set(CMAKE_ARCHIVE_OUTPUT_DIRECTORY "${PROJECT_BINARY_DIR}/lib")
file(RELATIVE_PATH QNS_LIBDIR_FROM_BINDIR
    "${CMAKE_INSTALL_FULL_BINDIR}" "${CMAKE_INSTALL_FULL_LIBDIR}")
set(CMAKE_INSTALL_RPATH "$ORIGIN/${QNS_LIBDIR_FROM_BINDIR};$ORIGIN")

add_compile_options(-Wall -Wextra -Wpedantic -Wshadow -Wundef -Wcast-align -Werror
    "$<$<COMPILE_LANGUAGE:CXX>:-Wnon-virtual-dtor;-Woverloaded-virtual;-Wextra-semi>")
add_compile_definitions(QT_NO_KEYWORDS QT_NO_CAST_FROM_ASCII)

if(QNS_SANITIZE)
    add_compile_options(-fsanitize=${QNS_SANITIZE} -fno-sanitize-recover=all
        -fno-omit-frame-pointer)
    add_link_options(-fsanitize=${QNS_SANITIZE})
    add_compile_definitions(QNS_SANITIZED) # for what sanitizers do not get on with
    if(QNS_SANITIZE MATCHES "undefined")
        # It looks at memory through a pipe of its own, and takes every object for a broken one
        # when there are no more descriptors: tests use them all up.
        add_compile_options(-fno-sanitize=vptr)
    endif()
endif()

if(QNS_COVERAGE)
    add_compile_options(-fprofile-instr-generate -fcoverage-mapping)
    add_link_options(-fprofile-instr-generate)
endif()

# A static library per source folder: qns_add_folder(NAME SOURCES... LINKS...)
# LINKS are what the folder's headers and sources use, and nothing more.
function(qns_add_folder name)
    cmake_parse_arguments(PARSE_ARGV 1 arg "QT" "" "SOURCES;LINKS")
    add_library(qns_${name} STATIC ${arg_SOURCES})
    target_include_directories(qns_${name} PUBLIC "${PROJECT_SOURCE_DIR}")
    target_link_libraries(qns_${name} PUBLIC ${arg_LINKS})
    # A back-trace names only what a program exports; shared libraries leave these out again.
    set_target_properties(qns_${name} PROPERTIES
        CXX_VISIBILITY_PRESET default VISIBILITY_INLINES_HIDDEN OFF)
    # What is exported could be replaced at run time, which forbids inlining: ours is not.
    target_compile_options(qns_${name} PRIVATE -fno-semantic-interposition)
    if(arg_QT)
        set_target_properties(qns_${name} PROPERTIES AUTOMOC ON)
    endif()
endfunction()

# Adds the folders in this order: qns_add_folders(FOLDERS... [ELSEWHERE FOLDERS...])
# A folder with a CMakeLists.txt must be named, so that none is left out without a word; ELSEWHERE
# names those that something else adds.
function(qns_add_folders)
    cmake_parse_arguments(PARSE_ARGV 0 arg "" "" "ELSEWHERE")
    foreach(folder IN LISTS arg_UNPARSED_ARGUMENTS)
        add_subdirectory(${folder})
    endforeach()
    file(GLOB lists RELATIVE "${CMAKE_CURRENT_SOURCE_DIR}" CONFIGURE_DEPENDS
        "${CMAKE_CURRENT_SOURCE_DIR}/*/CMakeLists.txt")
    foreach(list IN LISTS lists)
        get_filename_component(folder "${list}" DIRECTORY)
        if(NOT folder IN_LIST arg_UNPARSED_ARGUMENTS AND NOT folder IN_LIST arg_ELSEWHERE)
            message(FATAL_ERROR "${CMAKE_CURRENT_LIST_FILE} does not name the folder ${folder}")
        endif()
    endforeach()
endfunction()
