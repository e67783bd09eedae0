#include "callcontrol/CC_CallPool.h"
#include "calls/CC_Call.h"
#include "properties/CC_PropertyBoolean.h"
#include "properties/CC_PropertyId.h"
#include "testing/DrivenLoop.h"

#include <functional>
#include <gtest/gtest.h>
#include <string>
#include <utility>
#include <vector>

namespace
{
/// A property in whose dump something else happens.
class InterruptingProperty : public CC_PropertyBoolean
{
public:
    explicit InterruptingProperty(std::function<void(InfoContainer&)> interrupt)
        : CC_PropertyBoolean(CC_PropertyId::ENDPOINT_IS_ISDN), m_interrupt(std::move(interrupt))
    {
    }
    CC_Property* clone() const override { return new InterruptingProperty(*this); }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        m_interrupt(info);
        return info;
    }

private:
    std::function<void(InfoContainer&)> m_interrupt;
};

/// "level/detail key: text" of each entry.
std::vector<std::string> ENTRIES(InfoContainer const& info)
{
    std::vector<std::string> entries;
    for (unsigned int i = 0; i < info.getNumberOfEntries(); ++i)
    {
        InfoContainer::Entry const& entry = info.getEntry(i);
        String text;
        text.format("%u/%u %s: %s", entry.level, entry.detail, entry.key.c_str(), entry.text.c_str());
        entries.push_back(text.c_str());
    }
    return entries;
}

std::string WITH_ADDRESS(char const* before, void const* object)
{
    return before + std::string(String::addressOf(object).c_str());
}

class CC_CallPool_Info_Test : public testing::Test
{
protected:
    CC_CallPool_Info_Test() : m_a(m_pool.acquireCall()), m_b(m_pool.acquireCall()) {}
    ~CC_CallPool_Info_Test() override
    {
        m_pool.releaseCall(m_a);
        m_pool.releaseCall(m_b);
    }

    std::vector<std::string> dump(unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                                  unsigned int detail, char const* prefix)
    {
        InfoContainer info;
        EXPECT_EQ(&m_pool.getInfo(info, maxLevel, level, maxDetail, detail, prefix), &info);
        return ENTRIES(info);
    }

    DrivenLoop m_loop;
    CC_CallPool m_pool;
    CC_Call* m_a;
    CC_Call* m_b;
};
} // namespace

TEST_F(CC_CallPool_Info_Test, ThePoolStandsAboveItsCallsInTheirOrder)
{
    EXPECT_EQ(dump(4, 3, 5, 5, "My "),
              (std::vector<std::string>{WITH_ADDRESS("3/5 My Call Pool: ", &m_pool), WITH_ADDRESS("4/5 Call: ", m_a),
                                        WITH_ADDRESS("4/5 Call: ", m_b)}));
}

TEST_F(CC_CallPool_Info_Test, TheLimitsHold)
{
    struct Case
    {
        unsigned int maxLevel;
        unsigned int maxDetail;
        std::size_t entries;
    };
    for (Case const& row : {Case{4, 5, 3}, Case{3, 5, 1}, Case{2, 5, 0}, Case{4, 4, 0}, Case{3, 4, 0}})
        EXPECT_EQ(dump(row.maxLevel, 3, row.maxDetail, 5, "").size(), row.entries)
            << row.maxLevel << " " << row.maxDetail;
}

TEST_F(CC_CallPool_Info_Test, APoolInsideAnotherPoolsDumpShowsItselfAlone)
{
    CC_CallPool inner;
    CC_Call* const call = inner.acquireCall();
    std::vector<std::string> seen;
    ASSERT_TRUE(m_a->setProperty(InterruptingProperty(
                                     [&](InfoContainer&)
                                     {
                                         InfoContainer info;
                                         inner.getInfo(info, 9, 0, 9, 0, "");
                                         seen = ENTRIES(info);
                                     }))
                    .isOk());
    dump(9, 0, 9, 0, "");
    EXPECT_EQ(seen, std::vector<std::string>{WITH_ADDRESS("0/0 Call Pool: ", &inner)});

    InfoContainer info;
    inner.getInfo(info, 9, 0, 9, 0, "");
    EXPECT_GT(info.getNumberOfEntries(), 1u) << "outside it is complete again";
    inner.releaseCall(call);
}
