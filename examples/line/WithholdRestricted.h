#pragma once

#include "properties/CC_PropertyFilter.h"

/// Keeps the number and the name of a party who does not want them shown from reaching the telephone.
class WithholdRestricted : public CC_PropertyFilter
{
public:
    CC_PropertyFilter* clone() const override;
    XCode apply(CC_PropertyContainer& properties) const override;
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;
};
