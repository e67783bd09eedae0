#include "environment/CC_Environment.h"

CC_Environment const* CC_Environment::s_current = nullptr;
