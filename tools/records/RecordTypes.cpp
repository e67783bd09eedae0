#include "RecordTypes.h"

#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyQoS.h"
#include "properties/CC_PropertyTariff.h"

namespace
{
using Charge = CC_PropertyCharge::Charge;
using RTP = CC_QoS::MediaInfo::RTP;

struct Row
{
    char const* name;
    std::unique_ptr<AsnSyntax> (*create)();
};

template <class Type>
std::unique_ptr<AsnSyntax> NEW()
{
    return std::make_unique<Type>();
}

template <class Type>
constexpr Row ROW_OF()
{
    return {Type::TYPE_NAME, NEW<Type>};
}

constexpr Row ROWS[] = {
    ROW_OF<Q956::Currency>(),
    ROW_OF<Q956::CurrencyAmount>(),
    ROW_OF<AsnEnumerated<Q956::EMultiplier>>(),
    ROW_OF<Q956::Amount>(),
    ROW_OF<Q956::RecordedCurrency>(),
    ROW_OF<Q956::NumberOfUnits>(),
    ROW_OF<Q956::TypeOfUnit>(),
    ROW_OF<Q956::RecordedUnits>(),
    ROW_OF<Q956::RecordedUnitsList>(),
    ROW_OF<AsnEnumerated<Q956::ETypeOfChargingInfo>>(),
    ROW_OF<AsnEnumerated<Q956::EAOCDBillingId>>(),
    ROW_OF<AsnEnumerated<Q956::EAOCEBillingId>>(),
    ROW_OF<AsnEnumerated<Q956::EChargedItem>>(),
    ROW_OF<AsnEnumerated<Q956::EChargingType>>(),
    ROW_OF<AsnEnumerated<Q956::EScale>>(),
    ROW_OF<Q956::LengthOfTimeUnit>(),
    ROW_OF<Q956::Time>(),
    ROW_OF<AsnEnumerated<Q956::EVolumeUnit>>(),
    ROW_OF<Q956::DurationCurrency>(),
    ROW_OF<Q956::FlatRateCurrency>(),
    ROW_OF<Q956::VolumeRateCurrency>(),
    ROW_OF<Q956::SpecialChargingCode>(),
    ROW_OF<Q956::AOCSCurrencyInfo>(),
    ROW_OF<Charge>(),
    ROW_OF<Charge::Specific>(),
    ROW_OF<Charge::Specific::Recorded>(),
    ROW_OF<CC_PropertyTariff::Tariff>(),
    ROW_OF<CC_QoS>(),
    ROW_OF<CC_QoS::MediaInfo>(),
    ROW_OF<RTP>(),
    ROW_OF<RTP::RtpCfg>(),
    ROW_OF<RTP::RtpCfg::MediaType>(),
    ROW_OF<RTP::RtpStat>(),
    ROW_OF<RTP::RtpStat::Stat>(),
};
} // namespace

std::unique_ptr<AsnSyntax> RecordTypes::CREATE(std::string_view name)
{
    if (name == CC_PropertyQoS::TYPE_NAME)
        name = CC_QoS::TYPE_NAME;
    for (Row const& row : ROWS)
        if (name == row.name)
            return row.create();
    return nullptr;
}

std::vector<char const*> RecordTypes::NAMES()
{
    std::vector<char const*> names;
    for (Row const& row : ROWS)
        names.push_back(row.name);
    return names;
}

bool RecordTypes::TEXT_OF(AsnSyntax const& value, String& out)
{
    if (auto const* const charge = dynamic_cast<Charge const*>(&value))
        CC_PropertyCharge(CC_PropertyId::CHARGE, *charge).getValueString(out);
    else if (auto const* const tariff = dynamic_cast<CC_PropertyTariff::Tariff const*>(&value))
        CC_PropertyTariff(CC_PropertyId::TARIFF, *tariff).getValueString(out);
    else if (auto const* const qos = dynamic_cast<CC_QoS const*>(&value))
        CC_PropertyQoS(CC_PropertyId::QUALITY_OF_SERVICE, *qos).getValueString(out);
    else
        return false;
    return true;
}
