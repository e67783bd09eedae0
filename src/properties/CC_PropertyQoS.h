#pragma once

#include "properties/CC_PropertyValue.h"
#include "properties/CC_QoS.h"

/// The quality-of-service record of a leg's media stream. The built-in factory does not create it: whoever owns the
/// stream does, usually when the call ends. Not settable by text.
///
///     CC_QoS qos;
///     qos.m_meanOpinionScore = 412;
///     adapter.setOwnProperty(CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE, qos));
class CC_EXPORT CC_PropertyQoS : public CC_PropertyValue<CC_PropertyQoS, CC_QoS>
{
public:
    static constexpr char const* TYPE_NAME = "QoS";
    static TypeId s_typeId;

    using CC_PropertyValue::CC_PropertyValue;

    /// The entries of `getQoSInfo` as a tree, texts beginning in column 41.
    String& getValueString(String& out) const override;
    /// Adds the figures one below `level`: mean opinion score, media, and under the headings "Local" and "Remote",
    /// which stand at `level` behind the prefix, the statistics of each end that has any. What lies beyond a limit is
    /// left out. Returns `info`.
    InfoContainer& getQoSInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                              unsigned int detail, String const& prefix) const;
};
