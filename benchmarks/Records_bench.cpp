// The records that calls carry, as a gateway puts them into signalling messages and takes them out.
#include "CallScenario.h"
#include "properties/CC_PropertyCharge.h"
#include "properties/CC_PropertyTariff.h"
#include "properties/CC_QoS.h"

#include <benchmark/benchmark.h>

namespace
{
using Charge = CC_PropertyCharge::Charge;
using Tariff = CC_PropertyTariff::Tariff;

void SET(Q956::Amount& amount, int hundredths)
{
    amount.m_currencyAmount = hundredths;
    amount.m_multiplier = Q956::EMultiplier::ONE_HUNDREDTH;
}

/// 12.34 in all.
void FILL(Charge& charge)
{
    auto& specific = charge.select(charge.m_specific);
    specific.m_typeOfChargingInfo = Q956::ETypeOfChargingInfo::TOTAL;
    specific.setPresent(specific.m_billingId) = Q956::EAOCEBillingId::NORMAL_CHARGING;
    auto& currency = specific.m_recorded.select(specific.m_recorded.m_currency);
    currency.m_rCurrency = "EUR";
    SET(currency.m_rAmount, 1234);
}

Q956::AOCSCurrencyInfo::SpecificCurrency& APPEND_ITEM(Tariff& tariff, Q956::EChargedItem::Type item)
{
    Q956::AOCSCurrencyInfo* const info = tariff.m_currencyInfoList.append();
    MUST(info != nullptr, "append");
    info->m_chargedItem = item;
    return info->m_aOCSCurrencyInfo.select(info->m_aOCSCurrencyInfo.m_specificCurrency);
}

/// 0.10 for the set-up and 0.05 for each minute begun.
void FILL(Tariff& tariff)
{
    tariff.select(tariff.m_currencyInfoList);
    auto& setUp = APPEND_ITEM(tariff, Q956::EChargedItem::CALL_SETUP);
    auto& flatRate = setUp.select(setUp.m_flatRateCurrency);
    flatRate.m_fRCurrency = "EUR";
    SET(flatRate.m_fRAmount, 10);
    auto& communication = APPEND_ITEM(tariff, Q956::EChargedItem::BASIC_COMMUNICATION);
    auto& duration = communication.select(communication.m_durationCurrency);
    duration.m_dCurrency = "EUR";
    SET(duration.m_dAmount, 5);
    duration.m_dChargingType = Q956::EChargingType::STEP_FUNCTION;
    duration.m_dTime.m_lengthOfTimeUnit = 60;
    duration.m_dTime.m_scale = Q956::EScale::ONE_SECOND;
}

/// A call of three minutes in packets of 20 ms, counted at both ends.
void FILL(CC_QoS& qos)
{
    qos.m_voiceQuality = 93;
    qos.m_meanOpinionScore = 412;
    auto& rtp = qos.m_mediaInfo.select(qos.m_mediaInfo.m_rtp);
    rtp.m_codecChanges = 1;
    rtp.setPresent(rtp.m_config).m_mediaType.set({MG_Rtp::ECodec::PCMA, 20});
    auto& statistics = rtp.setPresent(rtp.m_statistics);
    for (auto* const stat : {&statistics.m_local, &statistics.m_remote})
    {
        statistics.setPresent(*stat);
        stat->m_rxPackets = 8997;
        stat->m_rxOctets = 1439520;
        stat->m_rxPacketsLost = 3;
        stat->m_rxJitter = 12;
        stat->m_txPackets = 9000;
        stat->m_txOctets = 1440000;
        stat->m_roundTripTime = 45;
    }
}

template <class Record>
void ENCODE(benchmark::State& state)
{
    Record record;
    FILL(record);
    AsnOctets octets;
    String error;
    for (auto _ : state)
    {
        MUST(record.encode(octets, error), "encode");
        benchmark::ClobberMemory();
    }
    Record decoded;
    MUST(decoded.decode(&octets[0], octets.getSize(), error), "decode");
    MUST(decoded == record, "encoding the same record");
    state.counters["octets"] = static_cast<double>(octets.getSize());
}

template <class Record>
void DECODE(benchmark::State& state)
{
    Record record;
    FILL(record);
    AsnOctets octets;
    String error;
    MUST(record.encode(octets, error), "encode");
    Record decoded;
    for (auto _ : state)
    {
        MUST(decoded.decode(&octets[0], octets.getSize(), error), "decode");
        benchmark::ClobberMemory();
    }
    MUST(decoded == record, "decoding the same record");
}

BENCHMARK(ENCODE<Charge>)->Name("Records/Encode/Charge");
BENCHMARK(ENCODE<Tariff>)->Name("Records/Encode/Tariff");
BENCHMARK(ENCODE<CC_QoS>)->Name("Records/Encode/QoS");
BENCHMARK(DECODE<Charge>)->Name("Records/Decode/Charge");
BENCHMARK(DECODE<Tariff>)->Name("Records/Decode/Tariff");
BENCHMARK(DECODE<CC_QoS>)->Name("Records/Decode/QoS");
} // namespace
