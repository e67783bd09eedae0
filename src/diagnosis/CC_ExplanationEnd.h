#pragma once

#include "diagnosis/CC_Explanation.h"

/// Says, in one sentence, what it takes for a call or leg to end, from what is known of it otherwise.
namespace CC_ExplanationEnd
{
void TELL(CC_Explanation::Call& call);
void TELL(CC_Explanation::Leg& leg);

/// "adapter `9` of endpoint `trunk`"
std::string NAME_OF(CC_Explanation::Adapter const& adapter);
/// "42.000 s"
std::string DURATION(long long nanoseconds);
/// For how long the loop has demonstrably begun no turn, ", and the loop has begun no turn for 42.000 s"; empty if it
/// has.
std::string STALL_OF(CC_Explanation::Call const& call);
std::string STALL_OF(CC_Explanation::Leg const& leg);
} // namespace CC_ExplanationEnd
