# The warnings that every file compiles under, and the sanitizers when asked for.
add_library(callcontrol_settings INTERFACE)
target_compile_options(callcontrol_settings INTERFACE
    -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wold-style-cast -Werror)
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU" AND CMAKE_CXX_COMPILER_VERSION VERSION_LESS 13)
    # optimising, g++ 12 sees an overlapping copy in "literal" + std::string where there is none (its bug 105651)
    target_compile_options(callcontrol_settings INTERFACE -Wno-restrict)
endif()
if(CMAKE_CXX_COMPILER_ID STREQUAL "GNU")
    # sources that are compiled together are taken for headers, whose classes should not be in anonymous namespaces
    target_compile_options(callcontrol_settings INTERFACE -Wno-subobject-linkage)
endif()
# and one's names lie behind the other's
target_compile_options(callcontrol_settings INTERFACE $<$<BOOL:$<TARGET_PROPERTY:UNITY_BUILD>>:-Wno-shadow>)
if(CALLCONTROL_SANITIZE)
    target_compile_options(callcontrol_settings INTERFACE
        -fsanitize=${CALLCONTROL_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_link_options(callcontrol_settings INTERFACE -fsanitize=${CALLCONTROL_SANITIZE})
endif()
