# cmake -DBUILD=<tree> -DSOURCE=<repo> -DCC=<C compiler> [-DTOOLCHAIN=<file> -DRUNNER=<wine-run.sh>]
#       -P CheckPackage.cmake
# Installs the tree into a fresh prefix, builds examples/hello against it both
# ways, through find_package(zor) and through pkg-config, and runs both (under
# wine for the Windows tree).
set(work ${BUILD}/package-test)
set(prefix ${work}/prefix)
file(REMOVE_RECURSE ${work})

function(run what)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "${what} failed (${rc}):\n${ARGN}\n${out}\n${err}")
  endif()
  set(run_out "${out}" PARENT_SCOPE)
endfunction()

run("install" ${CMAKE_COMMAND} --install ${BUILD} --prefix ${prefix})
foreach(f include/zor.h lib/pkgconfig/zor.pc lib/cmake/zor/zorConfig.cmake lib/cmake/zor/zorTargets.cmake)
  if(NOT EXISTS ${prefix}/${f})
    message(FATAL_ERROR "install did not put ${f}")
  endif()
endforeach()

set(cross "")
if(TOOLCHAIN)
  set(cross -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN})
endif()
run("the CMake package example" ${CMAKE_COMMAND} -S ${SOURCE}/examples/hello -B ${work}/cmake
    -DCMAKE_PREFIX_PATH=${prefix} -DCMAKE_BUILD_TYPE=Release ${cross})
run("building it" ${CMAKE_COMMAND} --build ${work}/cmake)

set(ENV{PKG_CONFIG_PATH} ${prefix}/lib/pkgconfig)
set(ENV{PKG_CONFIG_LIBDIR} ${prefix}/lib/pkgconfig)
run("pkg-config" pkg-config --cflags --libs zor)
string(STRIP "${run_out}" flags)
separate_arguments(flags UNIX_COMMAND "${flags}")
if(TOOLCHAIN)
  set(exe ${work}/hello-pc.exe)
  run("the pkg-config example" ${CC} ${SOURCE}/examples/hello/hello.c ${flags} -o ${exe})
  file(COPY ${prefix}/bin/zor.dll DESTINATION ${work}/cmake)
  file(COPY ${prefix}/bin/zor.dll DESTINATION ${work})
  set(programs ${work}/cmake/hello.exe ${exe})
else()
  set(exe ${work}/hello-pc)
  run("the pkg-config example" ${CC} ${SOURCE}/examples/hello/hello.c ${flags} -Wl,-rpath,${prefix}/lib -o ${exe})
  set(programs ${work}/cmake/hello ${exe})
endif()

foreach(p IN LISTS programs)
  run("running ${p}" ${RUNNER} ${p})
  if(NOT run_out MATCHES "zor 5\\.2" OR NOT run_out MATCHES "canny: status 0, [1-9][0-9]* edge pixels")
    message(FATAL_ERROR "${p} printed:\n${run_out}")
  endif()
  message(STATUS "${p}:\n${run_out}")
endforeach()
