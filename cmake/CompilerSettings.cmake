# The warnings that every file compiles under, and the sanitizers when asked for.
add_library(callcontrol_settings INTERFACE)
target_compile_options(callcontrol_settings INTERFACE
    -Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wold-style-cast -Werror)
if(CALLCONTROL_SANITIZE)
    target_compile_options(callcontrol_settings INTERFACE
        -fsanitize=${CALLCONTROL_SANITIZE} -fno-sanitize-recover=all -fno-omit-frame-pointer)
    target_link_options(callcontrol_settings INTERFACE -fsanitize=${CALLCONTROL_SANITIZE})
endif()
