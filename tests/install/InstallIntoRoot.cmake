# Installs a build tree into a scratch root, as a packager does: DESTDIR=ROOT and --prefix PREFIX.
#   cmake -DBINARY_DIR=<build tree> -DROOT=<scratch root> -DPREFIX=<prefix> -P InstallIntoRoot.cmake
file(REMOVE_RECURSE "${ROOT}")
execute_process(
    COMMAND ${CMAKE_COMMAND} -E env DESTDIR=${ROOT} ${CMAKE_COMMAND} --install ${BINARY_DIR} --prefix ${PREFIX}
    RESULT_VARIABLE status
    OUTPUT_VARIABLE output
    ERROR_VARIABLE output)
if(NOT status EQUAL 0)
    message(FATAL_ERROR "cmake --install failed (${status}):\n${output}")
endif()
