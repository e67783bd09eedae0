# Installs the build into a folder of its own, moves that, and uses everything from there.
function(must)
    execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE output ERROR_VARIABLE output)
    if(NOT result EQUAL 0)
        message(FATAL_ERROR "failed: ${ARGN}\n${output}")
    endif()
    set(output "${output}" PARENT_SCOPE)
endfunction()

# fails_with(regex command...): the command must fail and say so
function(fails_with regex)
    execute_process(COMMAND ${ARGN} RESULT_VARIABLE result OUTPUT_VARIABLE output ERROR_VARIABLE output)
    if(result EQUAL 0 OR NOT output MATCHES "${regex}")
        message(FATAL_ERROR "not refused with \"${regex}\": ${ARGN}\n${output}")
    endif()
endfunction()

unset(ENV{LD_LIBRARY_PATH})
file(REMOVE_RECURSE ${WORK})
must(${CMAKE_COMMAND} --install ${BUILD} --prefix ${WORK}/staged)
file(RENAME ${WORK}/staged ${WORK}/installed)

# with the CMake package
must(${CMAKE_COMMAND} -S ${SOURCE} -B ${WORK}/build -G ${GENERATOR} -DCMAKE_PREFIX_PATH=${WORK}/installed
    -DCMAKE_CXX_COMPILER=${COMPILER} -DCMAKE_TOOLCHAIN_FILE=${TOOLCHAIN} "-DCMAKE_CXX_FLAGS=${FLAGS}")
must(${CMAKE_COMMAND} --build ${WORK}/build)
foreach(program two_modules property_user kit_user memory_user kit_tests)
    must(${EMULATOR} ${WORK}/build/${program})
endforeach()
fails_with("leaves counted objects behind: .*CC_CallLeg: 1 more"
    ${EMULATOR} ${WORK}/build/kit_tests --gtest_also_run_disabled_tests)
fails_with("FailingAllocator: operator new does not ask it" ${EMULATOR} ${WORK}/build/memory_user_without_new)

# the module of the guide, from the sources that were installed; a cross build has no GoogleTest package to find
if(NOT TOOLCHAIN)
    must(${CMAKE_COMMAND} -S ${WORK}/installed/share/callcontrol/examples/line -B ${WORK}/line -G ${GENERATOR}
        -DCMAKE_PREFIX_PATH=${WORK}/installed -DCMAKE_CXX_COMPILER=${COMPILER}
        "-DCMAKE_CXX_FLAGS=${FLAGS} -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wold-style-cast -Werror")
    must(${CMAKE_COMMAND} --build ${WORK}/line)
    must(${WORK}/line/line_test)
    must(${WORK}/line/house)
    if(NOT output MATCHES "anna hears tone 6\n.*calls left: 0\n$")
        message(FATAL_ERROR "the house of the guide prints\n${output}")
    endif()
endif()

# with pkg-config
find_program(PKG_CONFIG pkg-config)
if(PKG_CONFIG AND NOT TOOLCHAIN)
    file(GLOB pc_folder ${WORK}/installed/lib*/pkgconfig ${WORK}/installed/lib/*/pkgconfig)
    set(ENV{PKG_CONFIG_LIBDIR} ${pc_folder})
    separate_arguments(FLAGS UNIX_COMMAND "${FLAGS}")
    function(build_and_run program package source)
        must(${PKG_CONFIG} --cflags ${package})
        separate_arguments(cflags UNIX_COMMAND "${output}")
        must(${PKG_CONFIG} --libs ${package})
        separate_arguments(libraries UNIX_COMMAND "${output}")
        must(${PKG_CONFIG} --variable=libdir callcontrol)
        string(STRIP "${output}" folder)
        must(${COMPILER} -std=c++20 ${FLAGS} ${cflags} ${source} ${ARGN} -o ${WORK}/${program} ${libraries}
            -Wl,-rpath,${folder})
        must(${WORK}/${program})
    endfunction()
    must(${PKG_CONFIG} --modversion callcontrol)
    string(STRIP "${output}" version)
    if(NOT version STREQUAL "${VERSION}")
        message(FATAL_ERROR "pkg-config finds version ${version}, not ${VERSION}")
    endif()
    must(${PKG_CONFIG} --variable=replaced_new callcontrol-testing)
    string(STRIP "${output}" replaced_new)
    build_and_run(two_modules callcontrol ${SOURCE}/../../examples/two_modules.cpp)
    build_and_run(kit_user callcontrol-testing ${SOURCE}/kit_user.cpp)
    build_and_run(memory_user callcontrol-testing ${SOURCE}/memory_user.cpp ${replaced_new})
endif()

# a module of somebody else's for the installed gateway
function(build_module name source)
    must(${PKG_CONFIG} --cflags callcontrol-gateway callcontrol-testing)
    separate_arguments(cflags UNIX_COMMAND "${output}")
    must(${PKG_CONFIG} --libs callcontrol-gateway callcontrol-testing)
    separate_arguments(libraries UNIX_COMMAND "${output}")
    must(${PKG_CONFIG} --variable=modules callcontrol-gateway)
    string(STRIP "${output}" folder)
    must(${COMPILER} -std=c++20 -shared -fPIC ${FLAGS} ${cflags} ${source}
        -o ${folder}/callcontrol-gateway-${name}.so ${libraries})
endfunction()

# the programs
must(${EMULATOR} ${WORK}/installed/bin/records decode Charge 8100)
if(EXISTS ${BUILD}/gateway/callcontrol-gateway)
    file(WRITE ${WORK}/gateway.toml "[[sip]]\nname = \"a\"\nlisten = \"127.0.0.1:21990\"\npeer = \"127.0.0.1:21991\"\n")
    must(${EMULATOR} ${WORK}/installed/bin/callcontrol-gateway --config ${WORK}/gateway.toml --check)
    build_module(fakes ${SOURCE}/../../gateway/tests/module/FakesModule.cpp)
    file(APPEND ${WORK}/gateway.toml "[[fakes]]\nname = \"b\"\n")
    must(${EMULATOR} ${WORK}/installed/bin/callcontrol-gateway --config ${WORK}/gateway.toml --check)
endif()
