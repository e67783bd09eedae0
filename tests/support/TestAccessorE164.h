#pragma once

#include "adapters/CC_CallAdapterE164_ValueOf.h"
#include "properties/CC_PropertyCodec.h"
#include "properties/CC_PropertyCodecs.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyQoS.h"
#include "testing/FailingAllocator.h"
#include "testing/RecordingPropertyFilter.h"
#include "tests/support/TestLineE164.h"

#include <tuple>
#include <type_traits>
#include <utility>

/// Two lines for one check of an accessor, with filters to put on either.
class AccessorLines : public TestLinesE164<>
{
public:
    /// Adds a filter to `filters`.
    template <class Apply>
    static void ADD(CC_PropertyFilterContainer& filters, Apply apply)
    {
        RecordingPropertyFilter filter("f");
        filter.onApply(std::move(apply));
        EXPECT_EQ(filters.addFilter(filter), XCode::OK);
    }
    void filterInputOfA() { a.endpoint.setInputFilterContainer(&m_filters); }
    void filterOutputOfB() { b.endpoint.setOutputFilterContainer(&m_filters); }

    using TestLinesE164<>::a;
    using TestLinesE164<>::b;
    using TestLinesE164<>::settle;

    CC_PropertyFilterContainer m_filters;

    ~AccessorLines() override
    {
        a.endpoint.setInputFilterContainer(nullptr);
        b.endpoint.setOutputFilterContainer(nullptr);
    }
    void TestBody() override {}
};

// --- two values of each type, the first of which is never what an absent property counts as --------------------------

template <class Value>
Value SAMPLE(bool isSecond)
{
    if constexpr (std::is_enum_v<Value>)
        return Value(isSecond ? 2 : 1);
    else if constexpr (std::is_same_v<Value, unsigned long long>)
        return isSecond ? 2 : 0x123456789abcdefULL;
    else
        return Value(isSecond ? "another text, too long to be kept without memory"
                              : "one text that is too long to be kept without memory");
}
template <>
inline VoipCodecListSet SAMPLE(bool isSecond)
{
    VoipCodecListSet codecs;
    EXPECT_EQ(codecs.getList(VoipCodecListSet::SEND_RECEIVE)
                  .append(VoipCodec(isSecond ? MG_Rtp::ECodec::PCMU : MG_Rtp::ECodec::PCMA, 20)),
              XCode::OK);
    return codecs;
}
template <>
inline VoipCodecAndMode SAMPLE(bool isSecond)
{
    return VoipCodecAndMode(VoipCodec(MG_Rtp::ECodec::PCMA, isSecond ? 10 : 20), VoipCodecAndMode::SEND_ONLY);
}
template <>
inline CC_PropertyTariff::Tariff SAMPLE(bool isSecond)
{
    CC_PropertyTariff::Tariff tariff;
    tariff.select(tariff.m_specialArrInfo) = isSecond ? 2 : 1;
    return tariff;
}
template <>
inline CC_PropertyCharge::Charge SAMPLE(bool isSecond)
{
    CC_PropertyCharge::Charge charge;
    if (isSecond)
        charge.select(charge.m_freeOfCharge);
    else
        charge.select(charge.m_chargeNotAvailable);
    return charge;
}
template <>
inline CC_QoS SAMPLE(bool isSecond)
{
    CC_QoS qos;
    qos.m_meanOpinionScore = isSecond ? 312 : 412;
    return qos;
}

// --- one row: the accessors of one id --------------------------------------------------------------------------------

/// What an absent property counts as.
enum class Absent
{
    NOTHING, ///< the empty text, 0, false, null
    TRUE,
    ARGUMENT ///< of the peer getter; the own getter gives 0
};

template <auto MEMBER>
inline constexpr bool IS_THERE = !std::is_null_pointer_v<decltype(MEMBER)>;

/// A gap is a nullptr.
template <class Property, auto OWN, auto PEER, auto EXISTS, auto SET, Absent ABSENT = Absent::NOTHING>
class Accessors
{
public:
    using Given = GivenBy<Property, &Property::getValue>;
    using Value = std::remove_cvref_t<Given>;
    static constexpr bool IS_RECORD = std::is_same_v<Value, CC_PropertyTariff::Tariff> ||
                                      std::is_same_v<Value, CC_PropertyCharge::Charge> || std::is_same_v<Value, CC_QoS>;
    using Result = std::conditional_t<IS_RECORD, Value const*, Given>;
    using Argument = std::conditional_t<std::is_scalar_v<Value>, Value, Value const&>;
    using WrongClass =
        std::conditional_t<std::is_same_v<Property, CC_PropertyUnsigned>, CC_PropertyString, CC_PropertyUnsigned>;

    static_assert(!IS_THERE<OWN> || std::is_same_v<decltype(OWN), Result (CC_CallAdapterE164::*)() const>);
    static_assert(!IS_THERE<PEER> || std::is_same_v<decltype(PEER), Result (CC_CallAdapterE164::*)() const> ||
                  std::is_same_v<decltype(PEER), Result (CC_CallAdapterE164::*)(Value) const>);
    static_assert(!IS_THERE<EXISTS> || std::is_same_v<decltype(EXISTS), bool (CC_CallAdapterE164::*)() const>);
    static_assert(!IS_THERE<SET> || std::is_same_v<decltype(SET), XCode (CC_CallAdapterE164::*)(Argument)>);

    static constexpr unsigned int COUNT = IS_THERE<OWN> + IS_THERE<PEER> + IS_THERE<EXISTS> + IS_THERE<SET>;

    static void absent(AccessorLines& lines, unsigned int id)
    {
        CC_CallAdapterE164 const idle;
        expectAbsent(idle, idle);
        expectExists(idle, false);
        ASSERT_EQ(lines.a.dial(), XCode::OK);
        if (lines.a.own(id) == "-") // each leg has a network and an id
        {
            expectAbsent(*lines.a.adapter, *lines.b.adapter);
            expectExists(*lines.b.adapter, false);
        }
    }

    static void setAndReadBack(AccessorLines& lines, unsigned int id)
    {
        CC_CallAdapterE164 idle;
        EXPECT_EQ(write(idle, id, sample()), XCode::ABSENT) << "without a leg";
        expectAbsent(idle, idle);
        ASSERT_EQ(lines.a.dial(), XCode::OK);
        CC_CallAdapterE164& adapter = *lines.a.adapter;
        for (bool const isSecond : {false, true})
        {
            Value const value = sample(isSecond);
            EXPECT_EQ(write(adapter, id, value), XCode::OK);
            expectStored(adapter.getOwnPropertyUnfiltered(id), id, value);
            expectValue(adapter, *lines.b.adapter, value);
            expectExists(*lines.b.adapter, true);
            expectInView(adapter, id);
        }
        lines.settle();
        EXPECT_TRUE(lines.b.module.getJournal().getLines().size() == 1) << "the peer's module is told";
    }

    static void wrongClass(AccessorLines& lines, unsigned int id)
    {
        CC_PropertyContainer own;
        ASSERT_EQ(own.set(WrongClass(id)), XCode::OK);
        ASSERT_EQ(lines.a.dial("4989", nullptr, "isdn", own), XCode::OK);
        ASSERT_NE(lines.b.adapter->getPeerProperty(id), nullptr);
        expectAbsent(*lines.a.adapter, *lines.b.adapter);
        expectExists(*lines.b.adapter, true); // of whatever class
    }

    /// Input filters change what a setter writes; output filters change what a getter reads.
    static void filtered(AccessorLines& lines, unsigned int id, bool isInput)
    {
        AccessorLines::ADD(
            lines.m_filters, [id](CC_PropertyContainer& properties)
            { return properties.get(id) != nullptr ? properties.set(Property(id, sample(true))) : XCode::OK; });
        ASSERT_EQ(lines.a.dial(), XCode::OK);
        isInput ? lines.filterInputOfA() : lines.filterOutputOfB();
        EXPECT_EQ(write(*lines.a.adapter, id, sample()), XCode::OK);
        expectStored(lines.a.adapter->getOwnPropertyUnfiltered(id), id, sample(isInput));
        expectPeer(*lines.b.adapter, sample(true));
    }
    static void inputFiltered(AccessorLines& lines, unsigned int id) { filtered(lines, id, true); }
    static void outputFiltered(AccessorLines& lines, unsigned int id) { filtered(lines, id, false); }

    static void withoutMemory(AccessorLines& lines, unsigned int id)
    {
        ASSERT_EQ(lines.a.dial(), XCode::OK);
        CC_CallAdapterE164& adapter = *lines.a.adapter;
        Value const value = sample();
        ASSERT_EQ(write(adapter, id, value), XCode::OK);
        expectReadingWithoutMemory(adapter, *lines.b.adapter);
        if constexpr (IS_THERE<SET>)
        {
            Value const second = sample(true);
            XCode result = XCode::FAILURE;
            for (unsigned long n = 1; n < 100; ++n)
            {
                FailingAllocator::failNth(n);
                result = (adapter.*SET)(second);
                FailingAllocator::stop();
                if (!FailingAllocator::hasFailed())
                    break;
                ASSERT_TRUE(result.isOk() || result == XCode::FAILURE) << "allocation " << n;
            }
            EXPECT_EQ(result, XCode::OK);
            expectOwn(adapter, second);
        }
    }

private:
    static Value sample(bool isSecond = false)
    {
        if constexpr (std::is_same_v<Value, bool>)
            return isSecond == (ABSENT == Absent::TRUE);
        else
            return SAMPLE<Value>(isSecond);
    }
    /// Through the setter; without one as any module may.
    static XCode write(CC_CallAdapterE164& adapter, unsigned int id, Value const& value)
    {
        if constexpr (IS_THERE<SET>)
            return (adapter.*SET)(value);
        else
            return adapter.setOwnProperty(Property(id, value));
    }
    static decltype(auto) peer(CC_CallAdapterE164 const& adapter, [[maybe_unused]] Value const& absent)
    {
        if constexpr (std::is_same_v<decltype(PEER), Result (CC_CallAdapterE164::*)() const>)
            return (adapter.*PEER)();
        else
            return (adapter.*PEER)(absent);
    }
    static bool is(Result given, Value const& value)
    {
        if constexpr (IS_RECORD)
            return given != nullptr && *given == value;
        else
            return given == value;
    }
    static bool isNothing(Result given)
    {
        if constexpr (IS_RECORD)
            return given == nullptr;
        else
            return given == Value();
    }

    static void expectAbsent([[maybe_unused]] CC_CallAdapterE164 const& own,
                             [[maybe_unused]] CC_CallAdapterE164 const& other)
    {
        if constexpr (IS_THERE<OWN>)
        {
            EXPECT_TRUE(ABSENT == Absent::TRUE ? is((own.*OWN)(), sample(true)) : isNothing((own.*OWN)()));
        }
        if constexpr (IS_THERE<PEER>)
            for (bool const isSecond : {false, true})
            {
                if constexpr (ABSENT == Absent::ARGUMENT)
                {
                    EXPECT_EQ(peer(other, sample(isSecond)), sample(isSecond));
                }
                else if constexpr (ABSENT == Absent::TRUE)
                {
                    EXPECT_TRUE(peer(other, sample(isSecond)));
                }
                else
                {
                    EXPECT_TRUE(isNothing(peer(other, sample(isSecond))));
                }
            }
    }
    static void expectReadingWithoutMemory([[maybe_unused]] CC_CallAdapterE164 const& own,
                                           [[maybe_unused]] CC_CallAdapterE164 const& other)
    {
        Value const none{};
        FailingAllocator::failNth(1);
        if constexpr (IS_THERE<OWN>)
            std::ignore = (own.*OWN)();
        if constexpr (IS_THERE<PEER>)
            std::ignore = peer(other, none);
        FailingAllocator::stop();
        EXPECT_FALSE(FailingAllocator::hasFailed());
    }
    static void expectOwn([[maybe_unused]] CC_CallAdapterE164 const& adapter, [[maybe_unused]] Value const& value)
    {
        if constexpr (IS_THERE<OWN>)
        {
            EXPECT_TRUE(is((adapter.*OWN)(), value));
        }
    }
    static void expectPeer([[maybe_unused]] CC_CallAdapterE164 const& adapter, [[maybe_unused]] Value const& value)
    {
        if constexpr (IS_THERE<PEER>)
        {
            EXPECT_TRUE(is(peer(adapter, Value()), value));
        }
    }
    static void expectValue(CC_CallAdapterE164 const& own, CC_CallAdapterE164 const& other, Value const& value)
    {
        expectOwn(own, value);
        expectPeer(other, value);
    }
    static void expectExists([[maybe_unused]] CC_CallAdapterE164 const& adapter, [[maybe_unused]] bool exists)
    {
        if constexpr (IS_THERE<EXISTS>)
        {
            EXPECT_EQ((adapter.*EXISTS)(), exists);
        }
    }
    static void expectStored(CC_Property const* stored, unsigned int id, Value const& value)
    {
        ASSERT_NE(stored, nullptr);
        EXPECT_EQ(stored->getId(), id);
        EXPECT_TRUE(stored->isEqual(Property(id, value)));
    }
    /// References and pointers lead into the view.
    static void expectInView([[maybe_unused]] CC_CallAdapterE164 const& adapter, [[maybe_unused]] unsigned int id)
    {
        if constexpr (IS_THERE<OWN> && (IS_RECORD || std::is_reference_v<Result>))
        {
            auto const* const seen = dynamic_cast<Property const*>(adapter.getOwnProperty(id));
            ASSERT_NE(seen, nullptr);
            if constexpr (IS_RECORD)
            {
                EXPECT_EQ((adapter.*OWN)(), &seen->getValue());
            }
            else
            {
                EXPECT_EQ(&(adapter.*OWN)(), &seen->getValue());
            }
        }
    }
};
