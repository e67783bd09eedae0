#include "platform/media/VoipCodecListSet.h"

#include <algorithm>

bool VoipCodecListSet::isEmpty() const
{
    return std::all_of(m_lists.begin(), m_lists.end(), [](VoipCodecList const& list) { return list.isEmpty(); });
}

VoipCodecListSet const& VoipCodecListSet::EMPTY()
{
    static VoipCodecListSet const s_empty;
    return s_empty;
}

String& VoipCodecListSet::getShortInfo(String& out) const
{
    static constexpr char const* s_headings[NUMBER_OF_LISTS] = {"", "send-only: ", "receive-only: "};
    out.clear();
    String one;
    for (unsigned int i = 0; i < NUMBER_OF_LISTS; ++i)
        if (!m_lists[i].isEmpty())
            out.concatf("%s%s%s", out.isEmpty() ? "" : "; ", s_headings[i], m_lists[i].getShortInfo(one).c_str());
    return out;
}
