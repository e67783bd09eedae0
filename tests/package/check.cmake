# Installs the build into a folder of its own and builds and runs a consumer against it.
function(must)
    execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE output ERROR_VARIABLE output)
    if(NOT result EQUAL 0)
        message(FATAL_ERROR "failed: ${ARGN}\n${output}")
    endif()
endfunction()

file(REMOVE_RECURSE ${WORK})
must(${CMAKE_COMMAND} --install ${BUILD} --prefix ${WORK}/installed)
must(${CMAKE_COMMAND} -S ${SOURCE} -B ${WORK}/build -DCMAKE_PREFIX_PATH=${WORK}/installed
    -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN} "-DCMAKE_CXX_FLAGS=${FLAGS}")
must(${CMAKE_COMMAND} --build ${WORK}/build)
must(${EMULATOR} ${WORK}/build/two_modules)
must(${EMULATOR} ${WORK}/build/kit_user)
