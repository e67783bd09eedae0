#include "sip/dialog/SipDescription.h"

#include "sip/dialog/SipParsedDescription.h"

bool SipDescription::IS_READABLE(std::string_view description)
{
    return SipParsedDescription(description).get() != nullptr;
}

bool SipDescription::IS_HOLD(std::string_view description)
{
    SipParsedDescription const parsed(description);
    bool hasVoice = false;
    for (sdp_media_t const* media = parsed.get() != nullptr ? parsed.get()->sdp_media : nullptr; media != nullptr;
         media = media->m_next)
    {
        if (media->m_type != sdp_media_audio || media->m_rejected)
            continue;
        if ((media->m_mode & sdp_recvonly) != 0)
            return false;
        hasVoice = true;
    }
    return hasVoice;
}

std::string SipDescription::REFUSING(std::string_view offer)
{
    SipParsedDescription const parsed(offer);
    if (parsed.get() == nullptr)
        return {};
    for (sdp_media_t* media = parsed.get()->sdp_media; media != nullptr; media = media->m_next)
    {
        media->m_port = 0;
        media->m_rejected = 1;
    }
    std::string answer = parsed.print();
    return IS_READABLE(answer) ? answer : std::string(); // the stack reads some that it cannot write
}
