# Writes the octets of each example in VECTORS into a file of its own below CORPUS.
file(MAKE_DIRECTORY ${CORPUS})
file(STRINGS ${VECTORS} lines REGEX "^[^#].*[|]")
foreach(line IN LISTS lines)
    string(REGEX MATCH "^[^ |]+" name "${line}")
    string(REGEX MATCH "[0-9A-Fa-f]+$" hex "${line}")
    # CMake writes no arbitrary octets; every shell's printf does
    string(REGEX REPLACE "(..)" "\\\\x\\1" escaped "${hex}")
    execute_process(COMMAND printf "%b" "${escaped}" OUTPUT_FILE ${CORPUS}/${name} COMMAND_ERROR_IS_FATAL ANY)
endforeach()
