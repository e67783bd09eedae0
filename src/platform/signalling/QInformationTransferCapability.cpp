#include "platform/signalling/QInformationTransferCapability.h"

#include "platform/base/NameOf.h"

namespace
{
constexpr NamedValue<QInformationTransferCapability> s_names[] = {
    {QInformationTransferCapability::SPEECH, "Speech"},
    {QInformationTransferCapability::UNRESTRICTED_DIGITAL, "Unrestricted digital information"},
    {QInformationTransferCapability::RESTRICTED_DIGITAL, "Restricted digital information"},
    {QInformationTransferCapability::AUDIO_3_1_KHZ, "3.1 kHz audio"},
    {QInformationTransferCapability::UNRESTRICTED_DIGITAL_WITH_TONES,
     "Unrestricted digital information with tones/announcements"},
    {QInformationTransferCapability::VIDEO, "Video"},
};
} // namespace

char const* QINFORMATION_TRANSFER_CAPABILITY_NAME(QInformationTransferCapability value)
{
    return NAME_OF(s_names, value);
}
