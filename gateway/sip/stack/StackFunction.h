#pragma once

#include <dlfcn.h>

/// The SIP stack's own function of that name, or that of a library of the stack's: what it would have called if this
/// module did not define one of that name, which the dynamic linker prefers.
template <class Function>
Function* STACK_FUNCTION(char const* name)
{
    static void* const s_stack = dlopen("libsofia-sip-ua.so.0", RTLD_NOW | RTLD_NOLOAD);
    return reinterpret_cast<Function*>(dlsym(s_stack, name));
}
