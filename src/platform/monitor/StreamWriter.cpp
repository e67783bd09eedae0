#include "platform/monitor/StreamWriter.h"

#include "platform/base/TYTime.h"

void RTD::StreamWriter::write(unsigned int monitorId, unsigned int level, char const* text)
{
    TY::Time const now = TY::Time::NOW(TY::Time::MONOTONIC);
    TYAutoLock<TYMutex> const lock(m_mutex);
    std::fprintf(m_stream, "%lld.%03ld [%u/%u] %s\n", now.seconds, now.nanoseconds / 1000000, monitorId, level, text);
}
