# What libvela-dev consists of: headers and libraries of the object layer and the host services, a CMake package and a
# pkg-config file, and a libnorv.so to link with.
include(CMakePackageConfigHelpers)
set(stub_dir ${CMAKE_INSTALL_LIBDIR}/lapdmon-stub)

foreach(folder vela hostsvc norv)
    install(DIRECTORY ${PROJECT_SOURCE_DIR}/${folder}/ DESTINATION ${LAPDMON_INCLUDE_DIR}/${folder}
        COMPONENT dev FILES_MATCHING PATTERN *.h)
endforeach()
install(TARGETS norv_interface vela_containers hostsvc vela EXPORT vela
    ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR} COMPONENT dev)
# In a folder of its own, in which no loader looks.
install(TARGETS norv_stub EXPORT vela LIBRARY DESTINATION ${stub_dir} COMPONENT dev)

target_compile_features(vela_containers PUBLIC cxx_std_20)
set(cmake_dir ${CMAKE_INSTALL_LIBDIR}/cmake/vela)
install(EXPORT vela NAMESPACE vela:: FILE velaTargets.cmake DESTINATION ${cmake_dir} COMPONENT dev)
configure_package_config_file(velaConfig.cmake.in ${CMAKE_CURRENT_BINARY_DIR}/velaConfig.cmake
    INSTALL_DESTINATION ${cmake_dir})
write_basic_package_version_file(${CMAKE_CURRENT_BINARY_DIR}/velaConfigVersion.cmake COMPATIBILITY SameMajorVersion)
file(RELATIVE_PATH prefix_from_here /${CMAKE_INSTALL_LIBDIR}/pkgconfig /)
configure_file(vela.pc.in vela.pc @ONLY)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/velaConfig.cmake ${CMAKE_CURRENT_BINARY_DIR}/velaConfigVersion.cmake
    DESTINATION ${cmake_dir} COMPONENT dev)
install(FILES ${CMAKE_CURRENT_BINARY_DIR}/vela.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig COMPONENT dev)
install(FILES ${PROJECT_SOURCE_DIR}/examples/vela_example.cc
    DESTINATION ${CMAKE_INSTALL_DATADIR}/doc/libvela-dev/examples COMPONENT dev)
