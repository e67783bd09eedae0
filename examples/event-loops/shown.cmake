# Whether the document shows the program as it is.
file(READ ${DOCUMENT} document)
file(READ ${EXAMPLE} example)
string(FIND "${document}" "```cpp\n${example}```" position)
if(position EQUAL -1)
    message(FATAL_ERROR "${DOCUMENT} does not show ${EXAMPLE} as it is")
endif()
