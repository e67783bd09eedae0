#include "WithholdRestricted.h"

#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyKeys.h"

#include <new>

CC_PropertyFilter* WithholdRestricted::clone() const { return new (std::nothrow) WithholdRestricted(*this); }

XCode WithholdRestricted::apply(CC_PropertyContainer& properties) const
{
    if (properties.get(Key::PRESENTATION_INDICATOR).getValueOr(QPresentationIndicator::ALLOWED) ==
        QPresentationIndicator::ALLOWED)
        return XCode::OK;
    properties.remove(CC_PropertyId::E164_NUMBER);
    properties.remove(CC_PropertyId::NAME);
    return XCode::OK;
}

InfoContainer& WithholdRestricted::getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level,
                                           unsigned int maxDetail, unsigned int detail, String const& prefix) const
{
    info.addWithin(maxLevel, level, maxDetail, detail, prefix, "Filter", "withholds restricted parties");
    return info;
}
