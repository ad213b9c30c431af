# Installation: `cmake --install <tree> --prefix <dir>` puts
#   include/zor.h                   the plain header (declarations written out)
#   lib/libzor.so*  |  bin/zor.dll, lib/libzor.dll.a, lib/zor.def
#   lib/pkgconfig/zor.pc            for pkg-config
#   lib/cmake/zor/                  find_package(zor), imported target zor::zor
#   share/doc/zor/                  README.md and the reference pages
include(CMakePackageConfigHelpers)

install(TARGETS zor EXPORT zorTargets
        RUNTIME DESTINATION ${CMAKE_INSTALL_BINDIR}
        LIBRARY DESTINATION ${CMAKE_INSTALL_LIBDIR}
        ARCHIVE DESTINATION ${CMAKE_INSTALL_LIBDIR})
install(FILES ${ZOR_GEN}/public/zor.h DESTINATION ${CMAKE_INSTALL_INCLUDEDIR})
if(WIN32)
  install(FILES ${ZOR_GEN}/zor.def DESTINATION ${CMAKE_INSTALL_LIBDIR})
endif()

set(ZOR_CMAKE_DIR ${CMAKE_INSTALL_LIBDIR}/cmake/zor)
install(EXPORT zorTargets NAMESPACE zor:: DESTINATION ${ZOR_CMAKE_DIR})
file(WRITE ${CMAKE_BINARY_DIR}/zorConfig.cmake.in
     "@PACKAGE_INIT@\ninclude(\"\${CMAKE_CURRENT_LIST_DIR}/zorTargets.cmake\")\ncheck_required_components(zor)\n")
configure_package_config_file(${CMAKE_BINARY_DIR}/zorConfig.cmake.in ${CMAKE_BINARY_DIR}/zorConfig.cmake
                              INSTALL_DESTINATION ${ZOR_CMAKE_DIR})
write_basic_package_version_file(${CMAKE_BINARY_DIR}/zorConfigVersion.cmake
                                 VERSION ${PROJECT_VERSION} COMPATIBILITY SameMajorVersion)
install(FILES ${CMAKE_BINARY_DIR}/zorConfig.cmake ${CMAKE_BINARY_DIR}/zorConfigVersion.cmake
        DESTINATION ${ZOR_CMAKE_DIR})

# pkg-config: paths relative to the .pc file, so an unpacked archive works
# wherever it lands.
file(RELATIVE_PATH ZOR_PC_UP /prefix/${CMAKE_INSTALL_LIBDIR}/pkgconfig /prefix)
file(RELATIVE_PATH ZOR_PC_INCLUDE /prefix /prefix/${CMAKE_INSTALL_INCLUDEDIR})
file(RELATIVE_PATH ZOR_PC_LIB /prefix /prefix/${CMAKE_INSTALL_LIBDIR})
file(WRITE ${CMAKE_BINARY_DIR}/zor.pc
     "prefix=\${pcfiledir}/${ZOR_PC_UP}\n"
     "includedir=\${prefix}/${ZOR_PC_INCLUDE}\n"
     "libdir=\${prefix}/${ZOR_PC_LIB}\n\n"
     "Name: zor\n"
     "Description: performance primitives for signals, images and small matrices\n"
     "Version: ${PROJECT_VERSION}\n"
     "Libs: -L\${libdir} -lzor\n"
     "Cflags: -I\${includedir}\n")
install(FILES ${CMAKE_BINARY_DIR}/zor.pc DESTINATION ${CMAKE_INSTALL_LIBDIR}/pkgconfig)

install(FILES README.md DESTINATION ${CMAKE_INSTALL_DOCDIR})
install(DIRECTORY docs/reference DESTINATION ${CMAKE_INSTALL_DOCDIR})
