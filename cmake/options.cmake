# Options of the build, and the compiler and linker options of every target.
include(GNUInstallDirs)

option(LAPDMON_TESTS "Build the tests" ON)
option(LAPDMON_WERROR "Treat warnings as errors" OFF)
option(LAPDMON_FUZZ "Build the fuzz targets for libFuzzer (clang), and no other tests" OFF)
set(LAPDMON_SANITIZE "" CACHE STRING "Comma-separated sanitizers, e.g. address,undefined or thread")

# The software board's libnorv.so is in a folder of its own, in which the loader does not look by itself.
set(LAPDMON_TRANSPORT_DIR lib/lapdmon)

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

# lapdmon_program(TARGET): a program that links the transport library. In the build tree its RUNPATH leads to the
# software board's library. It is RUNPATH and not RPATH, so that LD_LIBRARY_PATH comes first. The installed program
# has no RUNPATH. The linker gets the path directly, because CMake's own handling would leave an empty entry, which
# means the current directory.
function(lapdmon_program target)
    target_link_libraries(${target} PRIVATE norv)
    target_link_options(${target} PRIVATE
        -Wl,--enable-new-dtags -Wl,-rpath,${CMAKE_BINARY_DIR}/${LAPDMON_TRANSPORT_DIR})
    set_target_properties(${target} PROPERTIES SKIP_BUILD_RPATH TRUE)
    install(TARGETS ${target})
    install(CODE "file(RPATH_REMOVE FILE \"\$ENV{DESTDIR}\${CMAKE_INSTALL_PREFIX}/${CMAKE_INSTALL_BINDIR}/${target}\")")
endfunction()
