#pragma once

// The stack's header is for C alone. It needs timeval, which it does not declare.
#include <sys/time.h>

extern "C"
{
#include <libpri.h>
}
