#pragma once

#include "platform/signalling/QInformationTransferCapability.h"

/// What the bearer has to carry: the element Bearer Capability (Q.931, 4.5.5), octets 3 (information transfer
/// capability) and 5 (user information, layer 1 protocol). The mode is always circuit at 64 kbit/s.
struct IsdnBearer
{
    QInformationTransferCapability capability = QInformationTransferCapability::SPEECH;

    static IsdnBearer OF(int capability);
    int getCapability() const { return static_cast<int>(capability); }
    /// Octet 5, for speech and audio: G.711 A-law; -1: none, for what carries bits.
    int getLayer1() const;
    /// Whether speech comes over it, so that it may be transcoded.
    bool isSpeech() const;
};
