#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/base/TYVector.h"
#include "platform/base/XCode.h"
#include "platform/media/VoipCodec.h"

#include <cstddef>

/// Codecs in order of preference, the best liked first, each of them once. A value: copying one throws std::bad_alloc
/// when memory is out.
///
///     VoipCodecList codecs;
///     std::ignore = codecs.append(VoipCodec(MG_Rtp::ECodec::PCMA, 20));
class CC_EXPORT VoipCodecList
{
public:
    VoipCodecList() = default; ///< empty

    /// Adds the least liked codec: OK; REFUSED when the list holds it already, or when it is no codec; NO_ELEMENT when
    /// memory is out. The list is unchanged unless OK.
    XCode append(VoipCodec const& codec);
    /// Back to no codecs.
    void clear() { m_codecs.clear(); }

    /// The number of codecs. @{
    bool isEmpty() const { return m_codecs.isEmpty(); }
    std::size_t getSize() const { return m_codecs.getSize(); }
    /// @}
    /// REQUIRES: index < getSize()
    VoipCodec const& operator[](std::size_t index) const { return m_codecs[index]; }
    /// Whether it holds the codec with that very packet period.
    bool contains(VoipCodec const& codec) const;
    /// For walks from the best liked codec on. Changing the list ends them. @{
    auto begin() const { return m_codecs.begin(); }
    auto end() const { return m_codecs.end(); }
    /// @}

    /// Replaces `out` by the codecs' short infos in their order, "PCMA 20ms, G729 20ms"; the empty text for the empty
    /// list. Returns `out`. Throws std::bad_alloc when memory is out.
    String& getShortInfo(String& out) const;

    /// The same codecs in the same order.
    friend bool operator==(VoipCodecList const&, VoipCodecList const&) = default;

private:
    TYVector<VoipCodec> m_codecs;
};
