// A module that was built for an earlier gateway: its entry must not be called.
#include <cstdlib>

extern "C" __attribute__((visibility("default"))) unsigned int const callcontrol_gateway_module_version = 0;
extern "C" __attribute__((visibility("default"))) void* callcontrol_gateway_module() { std::abort(); }
