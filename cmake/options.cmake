# Options of the build, and the compiler and linker options of every target.
include(GNUInstallDirs)

option(LAPDMON_TESTS "Build the tests" ON)
option(LAPDMON_WERROR "Treat warnings as errors" OFF)
option(LAPDMON_FUZZ "Build the fuzz targets for libFuzzer (clang), and no other tests" OFF)
set(LAPDMON_SANITIZE "" CACHE STRING "Comma-separated sanitizers, e.g. address,undefined or thread")

# The software board's libnorv.so is in a folder of its own, in which the loader does not look by itself.
set(LAPDMON_TRANSPORT_DIR lib/lapdmon)
# The headers of the object layer, as they are included: vela/..., hostsvc/..., norv/...
set(LAPDMON_INCLUDE_DIR ${CMAKE_INSTALL_INCLUDEDIR}/lapdmon)
# Where the build makes manual pages and completion.
set(LAPDMON_MANUAL_DIR ${CMAKE_BINARY_DIR}/manual/made)
# Where zsh looks for completion: Debian's packages have a folder of their own.
if(CMAKE_INSTALL_PREFIX STREQUAL "/usr")
    set(LAPDMON_ZSH_DIR ${CMAKE_INSTALL_DATADIR}/zsh/vendor-completions)
else()
    set(LAPDMON_ZSH_DIR ${CMAKE_INSTALL_DATADIR}/zsh/site-functions)
endif()

add_library(lapdmon_options INTERFACE)
add_library(lapdmon::options ALIAS lapdmon_options)
target_include_directories(lapdmon_options INTERFACE ${PROJECT_SOURCE_DIR})
target_compile_options(lapdmon_options INTERFACE
    -Wall -Wextra -Wpedantic -Wshadow -Wnon-virtual-dtor -Woverloaded-virtual
    -Wcast-align -Wformat=2 -Wimplicit-fallthrough
    # The optimiser of g++ 12 gives these warnings wrongly, for the standard library's own code.
    $<$<CXX_COMPILER_ID:GNU>:-Wno-restrict -Wno-array-bounds -Wno-stringop-overflow -Wno-stringop-overread>)
if(LAPDMON_WERROR)
    target_compile_options(lapdmon_options INTERFACE -Werror)
endif()
if(LAPDMON_SANITIZE)
    target_compile_options(lapdmon_options INTERFACE
        -fsanitize=${LAPDMON_SANITIZE} -fno-omit-frame-pointer -fno-sanitize-recover=all)
    target_link_options(lapdmon_options INTERFACE -fsanitize=${LAPDMON_SANITIZE})
endif()
if(LAPDMON_SANITIZE MATCHES thread)
    target_sources(lapdmon_options INTERFACE
        $<$<STREQUAL:$<TARGET_PROPERTY:TYPE>,EXECUTABLE>:${PROJECT_SOURCE_DIR}/tests/support/sanitized_signals.cc>)
endif()
if(LAPDMON_FUZZ)
    target_compile_options(lapdmon_options INTERFACE -fsanitize=fuzzer-no-link)
endif()

# Hardening: makes it harder to exploit a fault of an installed program. tests/build checks the built files for it.
include(CheckPIESupported)
check_pie_supported()
set(CMAKE_POSITION_INDEPENDENT_CODE ON)
set(hardened "$<CONFIG:Release,RelWithDebInfo,MinSizeRel>")
target_compile_options(lapdmon_options INTERFACE
    "$<${hardened}:-U_FORTIFY_SOURCE;-D_FORTIFY_SOURCE=2;-fstack-protector-strong>")
target_link_options(lapdmon_options INTERFACE "$<${hardened}:LINKER:-z,relro,-z,now,-z,noexecstack>")

# Reproducible: what is installed does not depend on the folder that it was built in, nor on the time.
target_compile_options(lapdmon_options INTERFACE "$<${hardened}:-ffile-prefix-map=${PROJECT_SOURCE_DIR}=.>")
set(CMAKE_CXX_ARCHIVE_CREATE "<CMAKE_AR> qcD <TARGET> <LINK_FLAGS> <OBJECTS>")
set(CMAKE_CXX_ARCHIVE_APPEND "<CMAKE_AR> qD <TARGET> <LINK_FLAGS> <OBJECTS>")
set(CMAKE_CXX_ARCHIVE_FINISH "<CMAKE_RANLIB> -D <TARGET>")

# lapdmon_program(TARGET DESTINATION folder): a program that links the transport library. In the build tree its RUNPATH leads to the
# software board's library. It is RUNPATH and not RPATH, so that LD_LIBRARY_PATH comes first. It is relative to the
# program, because the build ID is made from it as well. The installed program has no RUNPATH. The linker gets the path
# directly, because CMake's own handling would leave an empty entry, which means the current directory; and in a file,
# because CMake and the shell both take "$" for their own.
set(LAPDMON_RUNPATH_OPTION ${CMAKE_BINARY_DIR}/runpath.option)
file(CONFIGURE OUTPUT ${LAPDMON_RUNPATH_OPTION} CONTENT "-Wl,-rpath,$ORIGIN/../${LAPDMON_TRANSPORT_DIR}\n" @ONLY)
function(lapdmon_program target)
    target_link_libraries(${target} PRIVATE norv)
    target_link_options(${target} PRIVATE
        -Wl,--enable-new-dtags @${LAPDMON_RUNPATH_OPTION})
    set_target_properties(${target} PROPERTIES SKIP_BUILD_RPATH TRUE)
    cmake_parse_arguments(P "" "DESTINATION" "" ${ARGN})
    install(TARGETS ${target} RUNTIME DESTINATION ${P_DESTINATION} COMPONENT lapdmon)
    install(CODE "file(RPATH_REMOVE FILE \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${P_DESTINATION}/${target}\")"
        COMPONENT lapdmon)
endfunction()
