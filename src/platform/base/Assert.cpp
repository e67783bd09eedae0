#include "platform/base/Assert.h"

#include <cstdio>
#include <cstdlib>

void TY::ASSERTION_FAILED(char const* file, int line, char const* text)
{
    std::fprintf(stderr, "%s:%d: %s\n", file, line, text);
    std::abort();
}
