# The version is the project's; its date is that of its heading in CHANGELOG.md. Pages and packages take both from here.
file(STRINGS ${PROJECT_SOURCE_DIR}/CHANGELOG.md heading REGEX "^## " LIMIT_COUNT 1)
if(NOT heading MATCHES "^## ([0-9.]+) \\((20[0-9][0-9]-[01][0-9]-[0-3][0-9])\\)$")
    message(FATAL_ERROR "CHANGELOG.md: the first heading of a version is no \"## VERSION (YYYY-MM-DD)\": ${heading}")
endif()
set(LAPDMON_DATE ${CMAKE_MATCH_2})
# The upgrade test builds packages of a lower version of the same tree.
set(LAPDMON_PACKAGE_VERSION ${PROJECT_VERSION} CACHE STRING "Version of the packages")
if(NOT CMAKE_MATCH_1 VERSION_EQUAL PROJECT_VERSION)
    message(FATAL_ERROR "CHANGELOG.md begins with version ${CMAKE_MATCH_1}; the project's is ${PROJECT_VERSION}")
endif()
