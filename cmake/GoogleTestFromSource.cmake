# GoogleTest for another machine than this one, from the sources that Debian's package `googletest` installs.
set(INSTALL_GTEST OFF)
if(NOT EXISTS /usr/src/googletest)
    message(FATAL_ERROR "The tests need GoogleTest's sources when cross compiling: install googletest")
endif()
add_subdirectory(/usr/src/googletest ${PROJECT_BINARY_DIR}/googletest EXCLUDE_FROM_ALL SYSTEM)
