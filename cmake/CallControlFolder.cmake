# callcontrol_folder(LIBRARY lib [PREFIX sub] HEADERS ... SOURCES ... [TESTS ...])
#
# One folder of the tree: its sources go into LIBRARY, its headers are installed under include/callcontrol/ at the path
# by which they are included, and its tests (files named after the class that they test) become one executable,
# <folder>_test. Files are listed explicitly.
function(callcontrol_folder)
    cmake_parse_arguments(PARSE_ARGV 0 ARG "" "LIBRARY" "HEADERS;SOURCES;TESTS")
    file(RELATIVE_PATH folder ${PROJECT_SOURCE_DIR}/src ${CMAKE_CURRENT_SOURCE_DIR})
    foreach(file IN LISTS ARG_SOURCES ARG_HEADERS)
        target_sources(${ARG_LIBRARY} PRIVATE ${CMAKE_CURRENT_SOURCE_DIR}/${file})
    endforeach()
    foreach(file IN LISTS ARG_HEADERS)
        get_filename_component(sub ${file} DIRECTORY)
        install(FILES ${file} DESTINATION ${CMAKE_INSTALL_INCLUDEDIR}/callcontrol/${folder}/${sub}
            COMPONENT headers)
        set_property(GLOBAL APPEND PROPERTY CALLCONTROL_HEADERS ${folder}/${file})
    endforeach()
    if(CALLCONTROL_BUILD_TESTS AND ARG_TESTS)
        string(REPLACE "/" "_" name ${folder})
        callcontrol_test(${name}_test ${ARG_TESTS})
    endif()
endfunction()

# callcontrol_test(name files...): an executable of GoogleTest cases under our test main, each case known to ctest; under
# an emulator and with sanitizers, where a program is slow to start, the executable is.
function(callcontrol_test name)
    add_executable(${name} ${ARGN})
    target_link_libraries(${name} PRIVATE callcontrol_settings callcontrol-testing-main GTest::gmock)
    if(CMAKE_CROSSCOMPILING) # only the libraries' own code is there to be seen as it is shipped
        target_compile_options(${name} PRIVATE -O0 -Wno-psabi)
        set_target_properties(${name} PROPERTIES UNITY_BUILD ON)
    endif()
    if(CMAKE_CROSSCOMPILING OR CALLCONTROL_SANITIZE)
        add_test(NAME ${name} COMMAND ${name} --gtest_brief=1)
        set_tests_properties(${name} PROPERTIES TIMEOUT 300)
    else()
        gtest_discover_tests(${name} TEST_PREFIX "${name}." DISCOVERY_TIMEOUT 120 PROPERTIES TIMEOUT 120)
    endif()
endfunction()
