#include "isdn/element/IsdnBearer.h"

#include "isdn/link/LibPri.h"

IsdnBearer IsdnBearer::OF(int capability)
{
    switch (capability)
    {
    case PRI_TRANS_CAP_DIGITAL:
    case PRI_TRANS_CAP_RESTRICTED_DIGITAL:
    case PRI_TRANS_CAP_3_1K_AUDIO:
    case PRI_TRANS_CAP_DIGITAL_W_TONES:
    case PRI_TRANS_CAP_VIDEO:
        return {static_cast<QInformationTransferCapability>(capability)};
    default:
        return {};
    }
}

int IsdnBearer::getLayer1() const { return isSpeech() ? PRI_LAYER_1_ALAW : -1; }

bool IsdnBearer::isSpeech() const
{
    return capability == QInformationTransferCapability::SPEECH ||
           capability == QInformationTransferCapability::AUDIO_3_1_KHZ;
}
