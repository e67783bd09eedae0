#include "platform/monitor/Monitor.h"

#include <algorithm>
#include <cstdio>
#include <memory>
#include <new>

namespace RTD
{
std::atomic<unsigned char> REPOSITORY::s_enabled[NUMBER_OF_MONITORS];
std::atomic<Writer*> REPOSITORY::s_writer{nullptr};

void REPOSITORY::ENABLE(unsigned int id, unsigned int level)
{
    if (id < NUMBER_OF_MONITORS)
        s_enabled[id].store(static_cast<unsigned char>(std::min(level, NUMBER_OF_LEVELS - 1)),
                            std::memory_order_relaxed);
}

void REPOSITORY::SET_WRITER(Writer* writer) { s_writer.store(writer, std::memory_order_release); }

Monitor const* REPOSITORY::CHANNEL(unsigned int id, unsigned int level)
{
    struct Channels
    {
        Monitor of[NUMBER_OF_MONITORS][NUMBER_OF_LEVELS];
        Channels()
        {
            for (unsigned int i = 0; i < NUMBER_OF_MONITORS; ++i)
                for (unsigned int j = 0; j < NUMBER_OF_LEVELS; ++j)
                {
                    of[i][j].m_id = i;
                    of[i][j].m_level = j;
                }
        }
    };
    static Channels const s_channels;
    return level == LEVEL_OFF || s_writer.load(std::memory_order_relaxed) == nullptr ? nullptr
                                                                                     : &s_channels.of[id][level];
}

void Monitor::debug(char const* format, ...) const
{
    Writer* const writer = REPOSITORY::s_writer.load(std::memory_order_acquire);
    if (writer == nullptr)
        return;
    char line[512];
    va_list arguments;
    va_start(arguments, format);
    va_list again;
    va_copy(again, arguments);
    int const length = std::vsnprintf(line, sizeof line, format, arguments);
    if (length >= 0 && static_cast<std::size_t>(length) < sizeof line)
        writer->write(m_id, m_level, line);
    else if (length >= 0)
    {
        std::unique_ptr<char[]> const longLine(new (std::nothrow) char[static_cast<std::size_t>(length) + 1]);
        if (longLine != nullptr)
            std::vsnprintf(longLine.get(), static_cast<std::size_t>(length) + 1, format, again);
        writer->write(m_id, m_level, longLine != nullptr ? longLine.get() : format);
    }
    va_end(again);
    va_end(arguments);
}
} // namespace RTD
