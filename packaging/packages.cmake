# The Debian packages: a row each, and what dpkg wants to know about all of them.
set(CPACK_GENERATOR DEB)
set(CPACK_PACKAGE_NAME lapdmon)
set(CPACK_PACKAGE_VERSION ${LAPDMON_PACKAGE_VERSION})
set(CPACK_PACKAGING_INSTALL_PREFIX /usr)
set(CPACK_PACKAGE_DIRECTORY ${CMAKE_BINARY_DIR}/packages)
set(CPACK_OUTPUT_FILE_PREFIX ${CPACK_PACKAGE_DIRECTORY})
set(CPACK_STRIP_FILES ON)
set(CPACK_INSTALL_DEFAULT_DIRECTORY_PERMISSIONS
    OWNER_READ OWNER_WRITE OWNER_EXECUTE GROUP_READ GROUP_EXECUTE WORLD_READ WORLD_EXECUTE)
set(CPACK_DEB_COMPONENT_INSTALL ON)
set(CPACK_DEBIAN_FILE_NAME DEB-DEFAULT)
set(CPACK_DEBIAN_PACKAGE_RELEASE 1)
set(CPACK_DEBIAN_PACKAGE_SECTION comm)
set(CPACK_DEBIAN_PACKAGE_MAINTAINER "The lapdmon developers <maintainers@users.noreply.c-seed-2b87c050.example>")
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS ON)
set(CPACK_DEBIAN_PACKAGE_CONTROL_STRICT_PERMISSION TRUE)
set(CPACK_DEBIAN_COMPRESSION_TYPE xz)
set(CPACK_PRE_BUILD_SCRIPTS ${CMAKE_CURRENT_SOURCE_DIR}/staged.cmake)

set(version "${LAPDMON_PACKAGE_VERSION}-${CPACK_DEBIAN_PACKAGE_RELEASE}")

# Debian's list of changes has the versions and dates of CHANGELOG.md.
file(STRINGS ${PROJECT_SOURCE_DIR}/CHANGELOG.md headings REGEX "^## ")
set(changes)
set(shown ${LAPDMON_PACKAGE_VERSION})
foreach(heading ${headings})
    string(REGEX MATCH "^## ([0-9.]+) \\((.*)\\)$" matched ${heading})
    set(changed ${CMAKE_MATCH_1})
    execute_process(COMMAND date -u -R -d ${CMAKE_MATCH_2} OUTPUT_VARIABLE date OUTPUT_STRIP_TRAILING_WHITESPACE
        COMMAND_ERROR_IS_FATAL ANY)
    if(NOT shown)
        set(shown ${changed})
    endif()
    string(APPEND changes "lapdmon (${shown}-${CPACK_DEBIAN_PACKAGE_RELEASE}) unstable; urgency=medium\n\n"
        "  * Version ${shown}. changelog.gz tells what changed.\n\n"
        " -- ${CPACK_DEBIAN_PACKAGE_MAINTAINER}  ${date}\n\n")
    set(shown)
endforeach()

# lapdmon_package(COMPONENT NAME summary text): a package, with its copyright and changes.
function(lapdmon_package component name summary text)
    string(TOUPPER ${component} upper)
    set(CPACK_DEBIAN_${upper}_PACKAGE_NAME ${name} PARENT_SCOPE)
    set(CPACK_COMPONENT_${upper}_DESCRIPTION "${summary}\n${text}" PARENT_SCOPE)
    set(CPACK_COMPONENTS_ALL ${CPACK_COMPONENTS_ALL} ${component} PARENT_SCOPE)
    set(made ${CMAKE_CURRENT_BINARY_DIR}/${name})
    set(folder ${CMAKE_INSTALL_DATADIR}/doc/${name})
    file(WRITE ${made}/changelog.Debian "${changes}")
    configure_file(${PROJECT_SOURCE_DIR}/CHANGELOG.md ${made}/changelog COPYONLY)
    execute_process(COMMAND gzip -9 -n -f -k ${made}/changelog.Debian ${made}/changelog COMMAND_ERROR_IS_FATAL ANY)
    install(FILES ${made}/changelog.Debian.gz ${made}/changelog.gz debian/copyright
        DESTINATION ${folder} COMPONENT ${component})
    if(EXISTS ${CMAKE_CURRENT_SOURCE_DIR}/debian/${name}.lintian-overrides)
        install(FILES debian/${name}.lintian-overrides DESTINATION ${CMAKE_INSTALL_DATADIR}/lintian/overrides
            RENAME ${name} COMPONENT ${component})
    endif()
endfunction()

set(CPACK_COMPONENTS_ALL)
lapdmon_package(lapdmon lapdmon "records the signalling of an ISDN D channel, decoded"
"lapdmon writes every frame that a KV9 telephony board sends or receives on the
D channel of a trunk into a log as text: LAPD header (Q.921), call-control
message (Q.931) field by field, and octets. It needs the transport library of
the board's package, libnorv.so. kv9relayd lets other machines trace the boards
of this one.")
lapdmon_package(lapdread lapdread "reads what was recorded of an ISDN D channel"
"lapdread reads logs of lapdmon and captures of other tools. It lists frames
and calls, says what is wrong with a trunk, explains octets, and writes
captures and JSON Lines.")
lapdmon_package(softboard softboard "runs lapdmon on simulated KV9 boards"
"softboard starts a program on a simulated board, which plays recorded D-channel
frames. Use it to try lapdmon without a board, and to test programs.")
lapdmon_package(fleet lapdmon-fleet "records of many hosts in one place"
"lapdship sends what a host has recorded of its ISDN D channels to NATS
JetStream. lapdstore keeps it in PostgreSQL, with calls and findings, where
lapdread asks it. Alerts for Prometheus are included.")
lapdmon_package(doc lapdmon-doc "documents of lapdmon, lapdread and softboard"
"How to run lapdmon, read its log, find out why a call failed, and how the
programs are made.")
lapdmon_package(dev libvela-dev "objects and messages of KV9 telephony boards"
"Headers and libraries of the object layer that lapdmon talks to a board with,
and of the host services below it. A libnorv.so to link with is included; the
board's own is needed to run a program.")

foreach(script postinst prerm postrm)
    list(APPEND CPACK_DEBIAN_LAPDMON_PACKAGE_CONTROL_EXTRA ${CMAKE_CURRENT_SOURCE_DIR}/debian/lapdmon/${script})
endforeach()
foreach(script postinst prerm postrm)
    list(APPEND CPACK_DEBIAN_FLEET_PACKAGE_CONTROL_EXTRA ${CMAKE_CURRENT_SOURCE_DIR}/debian/lapdmon-fleet/${script})
endforeach()
set(CPACK_DEBIAN_FLEET_PACKAGE_DEPENDS adduser)
set(CPACK_DEBIAN_FLEET_PACKAGE_SUGGESTS "lapdmon, lapdread, lapdmon-doc, nats-server, postgresql, prometheus")
# The services record with lapdread, under a user of their own.
set(CPACK_DEBIAN_LAPDMON_PACKAGE_DEPENDS "adduser, lapdread (= ${version})")
set(CPACK_DEBIAN_LAPDREAD_PACKAGE_SUGGESTS "lapdmon-doc")
set(CPACK_DEBIAN_LAPDMON_PACKAGE_SUGGESTS "softboard, lapdmon-doc")
set(CPACK_DEBIAN_SOFTBOARD_PACKAGE_RECOMMENDS "lapdmon")
set(CPACK_DEBIAN_DOC_PACKAGE_ARCHITECTURE all)
set(CPACK_DEBIAN_DOC_PACKAGE_SECTION doc)
set(CPACK_DEBIAN_DOC_PACKAGE_SHLIBDEPS OFF)
set(CPACK_DEBIAN_DEV_PACKAGE_SECTION libdevel)
set(CPACK_DEBIAN_DEV_PACKAGE_DEPENDS "libc6-dev, libstdc++-12-dev")
set(CPACK_DEBIAN_DEV_PACKAGE_SHLIBDEPS OFF)

# dpkg-shlibdeps finds the programs' libnorv.so here. The package depends on no other for it.
set(CPACK_DEBIAN_PACKAGE_SHLIBDEPS_PRIVATE_DIRS ${CMAKE_BINARY_DIR}/${LAPDMON_TRANSPORT_DIR})
include(CPack)
