# SPDX-License-Identifier: MIT
# The Debian packages, one for each component: "cpack" in the build folder makes them.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME qnsmedia)
set(CPACK_PACKAGE_VENDOR "The QNSMediaService developers")
set(CPACK_PACKAGE_CONTACT "The QNSMediaService developers <qnsmedia@localhost>")
set(CPACK_PACKAGE_DIRECTORY "${PROJECT_BINARY_DIR}/packages")
set(CPACK_STRIP_FILES ON)
set(CPACK_PRE_BUILD_SCRIPTS "${CMAKE_CURRENT_SOURCE_DIR}/CompressManuals.cmake")
# Units and the like name the folders that this build was configured for.
set(CPACK_PACKAGING_INSTALL_PREFIX "${CMAKE_INSTALL_PREFIX}")

set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS "${CMAKE_LIBRARY_OUTPUT_DIRECTORY}")
# Lets those who link a library depend on its package.
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS ON)
set(CPACK_DEBIAN_PACKAGE_GENERATE_SHLIBS_POLICY ">=")

# A package for a component: qns_package(COMPONENT NAME SECTION SUMMARY DESCRIPTION
# [DEPENDS packages] [RECOMMENDS packages] [SCRIPTS files...])
# DEPENDS names what no program's list of libraries tells.
set(CPACK_COMPONENTS_ALL)
macro(qns_package component name section summary description)
    cmake_parse_arguments(arg "" "DEPENDS;RECOMMENDS" "SCRIPTS" ${ARGN})
    string(TOUPPER ${component} key)
    list(APPEND CPACK_COMPONENTS_ALL ${component})
    set(CPACK_DEBIAN_${key}_PACKAGE_NAME ${name})
    set(CPACK_DEBIAN_${key}_PACKAGE_SECTION ${section})
    set(CPACK_DEBIAN_${key}_DESCRIPTION "${summary}\n${description}")
    set(CPACK_DEBIAN_${key}_PACKAGE_DEPENDS "${arg_DEPENDS}")
    set(CPACK_DEBIAN_${key}_PACKAGE_RECOMMENDS "${arg_RECOMMENDS}")
    set(CPACK_DEBIAN_${key}_PACKAGE_CONTROL_EXTRA "${arg_SCRIPTS}")
    install(FILES "${PROJECT_SOURCE_DIR}/LICENSE" DESTINATION "${CMAKE_INSTALL_DATADIR}/doc/${name}"
        RENAME copyright COMPONENT ${component})
endmacro()

# Another engine or another system library may take a package's place: it provides the name in the
# same major version.
set(scripts "${CMAKE_CURRENT_SOURCE_DIR}/debian")
qns_package(daemon qnsmediaservice video "media service daemon"
    "Plays and reads media for all other processes of a device."
    DEPENDS "libmediaplayer-proxy1 (>= 1.0), libqnsys1 (>= 1.0)"
    RECOMMENDS "systemd | systemd-standalone-sysusers, logrotate"
    SCRIPTS "${scripts}/postinst" "${scripts}/prerm" "${scripts}/postrm"
        "${CMAKE_CURRENT_BINARY_DIR}/conffiles")
qns_package(engine libmediaplayer-proxy1 libs "media engine of the media service, on GStreamer"
    "Plays, reads and imports media for the daemon. A device can bring another."
    DEPENDS "libqnsys1 (>= 1.0), gstreamer1.0-plugins-base"
    RECOMMENDS "gstreamer1.0-alsa, gstreamer1.0-plugins-good, gstreamer1.0-plugins-bad, gstreamer1.0-plugins-ugly, gstreamer1.0-libav")
qns_package(qnsys libqnsys1 libs "system services of the media service, on plain Linux"
    "Directories, system log, back-traces. A device can bring another.")
qns_package(client libqnsmediaclient1 libs "client library of the media service"
    "Lets a program play, read and import media through the daemon.")
qns_package(development libqnsmedia-dev libdevel "development files of the media service"
    "Headers of the client library, the engine and the system services."
    DEPENDS "libqnsmediaclient1 (= ${PROJECT_VERSION}), libqnsys1 (= ${PROJECT_VERSION})")
qns_package(tool qnsmedia video "command-line tool of the media service"
    "Plays, describes and imports media through the daemon."
    DEPENDS "libqnsmediaclient1 (>= ${PROJECT_VERSION})"
    RECOMMENDS "qnsmediaservice")
qns_package(desktop qnsmedia-mpris video "shows the media service's player on the desktop"
    "Lets desktops, media keys and playerctl control what the daemon plays."
    DEPENDS "libqnsmediaclient1 (>= ${PROJECT_VERSION})"
    RECOMMENDS "qnsmediaservice")

# Nothing is installed that no package contains.
get_cmake_property(components COMPONENTS)
foreach(component IN LISTS components)
    if(NOT component IN_LIST CPACK_COMPONENTS_ALL)
        message(FATAL_ERROR "install(... COMPONENT ${component}) belongs to no package")
    endif()
endforeach()

# Which libraries a program needs is known of this machine's packages only.
if(NOT CMAKE_CROSSCOMPILING)
    include(CPack)
endif()
