#include "sip/dialog/SipMedia.h"

#include "media/context/CallMedia.h"
#include "sip/dialog/SipStream.h"

#include <optional>

void SipMedia::turnOn(IpAddress const& local)
{
    m_isOn = true;
    m_local = local;
}

bool SipMedia::open(MG_IContext* context)
{
    if (!m_isOn || m_leg != nullptr)
        return true;
    CallMedia* const call = CallMedia::OF(context);
    m_leg = call != nullptr ? call->addLeg(m_local, *this) : nullptr;
    return m_leg != nullptr;
}

std::string SipMedia::toPeer(std::string const& description, MG_IContext* context)
{
    if (!m_isOn || description.empty())
        return description;
    if (!open(context))
        throw NoPort();
    if (description == m_source)
        return m_written;
    m_written = SipStream::WITH_ADDRESS(description, {m_leg->getLocalRtp(), m_leg->getNumber(), ++m_version});
    m_source = description;
    return m_written;
}

void SipMedia::note(bool isOurs, std::string const& description)
{
    if (m_isOn && !description.empty())
        (isOurs ? m_ours : m_far) = description;
}

void SipMedia::settle()
{
    if (m_leg == nullptr || m_ours.empty() || m_far.empty())
        return;
    if (std::optional<MediaDescription> const agreed = SipStream::AGREED(m_ours, m_far))
        m_leg->describe(*agreed);
}

void SipMedia::follow(MG_IContext* context)
{
    CallMedia* const call = m_leg != nullptr ? CallMedia::OF(context) : nullptr;
    if (call != nullptr && call != &m_leg->getCall())
        m_leg->moveTo(*call);
}

void SipMedia::onSilence(unsigned int seconds)
{
    if (m_onSilence)
        m_onSilence(seconds);
}
