#pragma once

#include "platform/base/Export.h"
#include "platform/base/String.h"
#include "platform/media/VoipCodecList.h"

#include <array>

/// Every codec that a side of a call supports: one list for what it can both send and receive, one for what it can only
/// send and one for what it can only receive. A value: copying one throws std::bad_alloc when memory is out.
///
///     VoipCodecListSet supported;
///     std::ignore = supported.getList(VoipCodecListSet::SEND_RECEIVE).append(VoipCodec(MG_Rtp::ECodec::PCMA, 20));
class CC_EXPORT VoipCodecListSet
{
public:
    /// Seen from the side that supports the codecs.
    enum Direction : unsigned int
    {
        SEND_RECEIVE = 0,
        SEND_ONLY = 1,
        RECEIVE_ONLY = 2
    };
    /// One for each direction.
    static constexpr unsigned int NUMBER_OF_LISTS = 3;

    VoipCodecListSet() = default; ///< three empty lists

    /// REQUIRES: direction < NUMBER_OF_LISTS @{
    VoipCodecList& getList(Direction direction) { return m_lists[direction]; }
    VoipCodecList const& getList(Direction direction) const { return m_lists[direction]; }
    /// @}
    bool isEmpty() const; ///< all three are

    /// A shared instance without codecs, for getters that return a reference.
    static VoipCodecListSet const& EMPTY();

    /// Replaces `out` by the lists that are not empty, in the order of their numbers and all but the first with a
    /// heading: "PCMA 20ms, PCMU 20ms; send-only: G729 20ms; receive-only: GSM". The empty text when all are empty.
    /// Returns `out`. Throws std::bad_alloc when memory is out.
    String& getShortInfo(String& out) const;

    /// All three lists are.
    friend bool operator==(VoipCodecListSet const&, VoipCodecListSet const&) = default;

private:
    std::array<VoipCodecList, NUMBER_OF_LISTS> m_lists;
};
