#include "platform/base/TYInstances.h"

#include <gtest/gtest.h>
#include <memory>
#include <string>

namespace
{
class Counted
{
public:
    explicit Counted(char letter) : m_letter(letter) { s_instances.add(*this); }
    ~Counted() { s_instances.remove(*this); }

    static std::string ALL()
    {
        std::string letters;
        s_instances.forEach([&](Counted const& counted) { letters += counted.m_letter; });
        return letters;
    }

private:
    friend class TYInstances<Counted>;
    static TYInstances<Counted> s_instances;

    char m_letter;
    TYInstances<Counted>::Links m_links;
};
TYInstances<Counted> Counted::s_instances;
} // namespace

TEST(TYInstances, AreThoseAliveTheNewestFirst)
{
    EXPECT_EQ(Counted::ALL(), "");
    auto a = std::make_unique<Counted>('a');
    auto b = std::make_unique<Counted>('b');
    auto c = std::make_unique<Counted>('c');
    EXPECT_EQ(Counted::ALL(), "cba");
    b.reset(); // in the middle
    EXPECT_EQ(Counted::ALL(), "ca");
    c.reset(); // the last
    auto const d = std::make_unique<Counted>('d');
    EXPECT_EQ(Counted::ALL(), "da");
    a.reset(); // the first
    EXPECT_EQ(Counted::ALL(), "d");
}

TEST(TYInstances, TheLastOneLeavesNone)
{
    {
        Counted const only('o');
        EXPECT_EQ(Counted::ALL(), "o");
    }
    EXPECT_EQ(Counted::ALL(), "");
}
