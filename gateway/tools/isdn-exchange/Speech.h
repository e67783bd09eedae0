#pragma once

#include "isdn/line/IsdnBlock.h"
#include "isdn/line/IsdnDescriptor.h"

#include <cstdio>
#include <memory>
#include <string>
#include <vector>

/// What is said and heard on one B channel, 20 ms at a time.
class Speech
{
public:
    /// `what`: silence, echo, tone, or file: raw A-law, silence behind its end. `record`: where what is heard is kept;
    /// empty: nowhere.
    Speech(IsdnDescriptor&& channel, std::string what, std::string const& file, std::string const& record);

    /// Every 20 ms.
    void tick();
    unsigned long getNumberOfBlocks() const { return m_heard; }

private:
    void hear(IsdnBlock const& block);
    IsdnBlock makeBlock();

    struct Close
    {
        void operator()(std::FILE* file) const { std::fclose(file); }
    };

    IsdnDescriptor m_channel;
    std::string m_what;
    std::vector<unsigned char> m_sound;
    std::unique_ptr<std::FILE, Close> m_record;
    std::size_t m_position = 0;
    std::uint32_t m_timestamp = 0;
    unsigned long m_heard = 0;
};
