#pragma once

/// Marks what a shared library offers to others. Everything else is hidden (-fvisibility=hidden).
#define CC_EXPORT __attribute__((visibility("default")))
