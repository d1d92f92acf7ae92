# Installs the built library into a scratch prefix, then builds and runs a consumer
# against it twice: once through find_package, once through pkg-config.
# The install is staged under DESTDIR, so the configured prefix (which nax.pc records)
# stays as it is; pkg-config finds the staged files through PKG_CONFIG_SYSROOT_DIR.
file(REMOVE_RECURSE ${WORK_DIR})
set(stage ${WORK_DIR}/stage)
set(prefix ${stage}${INSTALL_PREFIX})
set(libdir ${stage}${INSTALL_FULL_LIBDIR})

function(run)
  execute_process(COMMAND ${ARGN} RESULT_VARIABLE rc OUTPUT_VARIABLE out ERROR_VARIABLE err)
  if(NOT rc EQUAL 0)
    message(FATAL_ERROR "command failed (${rc}): ${ARGN}\n${out}\n${err}")
  endif()
endfunction()

run(${CMAKE_COMMAND} -E env DESTDIR=${stage} ${CMAKE_COMMAND} --install ${NAX_BINARY_DIR})

# find_package(nax CONFIG REQUIRED) + nax::nax
run(${CMAKE_COMMAND} -S ${CONSUMER_SOURCE_DIR} -B ${WORK_DIR}/cmake-build
    -DCMAKE_PREFIX_PATH=${prefix} -DCMAKE_CXX_COMPILER=${CXX_COMPILER}
    -DCMAKE_BUILD_RPATH=${libdir})
run(${CMAKE_COMMAND} --build ${WORK_DIR}/cmake-build)
run(${WORK_DIR}/cmake-build/consumer)

# pkg-config --cflags --libs nax
find_program(PKG_CONFIG pkg-config REQUIRED)
set(ENV{PKG_CONFIG_PATH} ${libdir}/pkgconfig)
set(ENV{PKG_CONFIG_SYSROOT_DIR} ${stage})
execute_process(COMMAND ${PKG_CONFIG} --cflags --libs nax OUTPUT_VARIABLE flags
                RESULT_VARIABLE rc OUTPUT_STRIP_TRAILING_WHITESPACE)
if(NOT rc EQUAL 0)
  message(FATAL_ERROR "pkg-config does not find nax in ${libdir}/pkgconfig")
endif()
separate_arguments(flags UNIX_COMMAND "${flags}")
run(${CXX_COMPILER} ${CONSUMER_SOURCE_DIR}/main.cpp ${flags} -Wl,-rpath,${libdir}
    -o ${WORK_DIR}/consumer-pkgconfig)
run(${WORK_DIR}/consumer-pkgconfig)
message(STATUS "find_package and pkg-config consumers built and ran")
