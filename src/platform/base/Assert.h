#pragma once

#include "platform/base/Export.h"

/// Stops a debug build with a clear text when a caller breaks a documented precondition; a release build goes on.
///
///     TY_ASSERT(index < m_count, "index past the end");
#ifdef NDEBUG
#define TY_ASSERT(condition, text) static_cast<void>(0)
#else
#define TY_ASSERT(condition, text) ((condition) ? static_cast<void>(0) : TY::ASSERTION_FAILED(__FILE__, __LINE__, text))
#endif

namespace TY
{
/// Prints "FILE:LINE: TEXT" on the standard error stream and aborts.
[[noreturn]] CC_EXPORT void ASSERTION_FAILED(char const* file, int line, char const* text);
} // namespace TY
