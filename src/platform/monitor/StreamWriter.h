#pragma once

#include "platform/base/TYMutex.h"
#include "platform/monitor/Monitor.h"

#include <cstdio>

namespace RTD
{
/// Writes log lines to a stdio stream: "SECONDS.MILLISECONDS [ID/LEVEL] TEXT", by the monotonic clock.
class CC_EXPORT StreamWriter : public Writer
{
public:
    /// Does not own the stream.
    explicit StreamWriter(std::FILE* stream) : m_stream(stream) {}
    void write(unsigned int monitorId, unsigned int level, char const* text) override;

private:
    std::FILE* m_stream;
    TYMutex m_mutex;
};
} // namespace RTD
