# cmake -DNATIVE=<tree> -DWIN=<tree> -DSOURCE=<repo> -DOUT=<dir> -P Dist.cmake
# The release archives, from two built trees:
#   zor-<version>-linux-x86_64.tar.gz  include/zor.h, lib/libzor.so*, lib/pkgconfig,
#                                      lib/cmake/zor, share/doc/zor, README.md
#   zor-<version>-win32.zip            bin/zor.dll, lib/libzor.dll.a, lib/zor.def,
#                                      include/zor.h, lib/pkgconfig, lib/cmake/zor,
#                                      share/doc/zor, README.md
foreach(tree ${NATIVE} ${WIN})
  if(NOT EXISTS ${tree}/CMakeCache.txt)
    message(FATAL_ERROR "${tree} is not a built tree (make native win)")
  endif()
endforeach()
file(STRINGS ${NATIVE}/CMakeCache.txt version REGEX "^CMAKE_PROJECT_VERSION:")
string(REGEX REPLACE ".*=" "" version "${version}")
get_filename_component(OUT ${OUT} ABSOLUTE)
file(REMOVE_RECURSE ${OUT}/stage)
foreach(kind linux-x86_64 win32)
  set(tree ${NATIVE})
  set(archive ${OUT}/zor-${version}-${kind}.tar.gz)
  set(pack czf)
  if(kind STREQUAL "win32")
    set(tree ${WIN})
    set(archive ${OUT}/zor-${version}-${kind}.zip)
    set(pack cf)
  endif()
  set(name zor-${version}-${kind})
  execute_process(COMMAND ${CMAKE_COMMAND} --install ${tree} --prefix ${OUT}/stage/${name}
                  RESULT_VARIABLE rc OUTPUT_QUIET)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "installing ${tree} failed")
  endif()
  file(COPY ${SOURCE}/README.md DESTINATION ${OUT}/stage/${name})
  file(REMOVE ${archive})
  set(format --format=gnutar)
  if(kind STREQUAL "win32")
    set(format --format=zip)
  endif()
  execute_process(COMMAND ${CMAKE_COMMAND} -E tar ${pack} ${archive} ${format} ${name}
                  WORKING_DIRECTORY ${OUT}/stage RESULT_VARIABLE rc)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "packing ${archive} failed")
  endif()
  message(STATUS "wrote ${archive}")
endforeach()
file(REMOVE_RECURSE ${OUT}/stage)
