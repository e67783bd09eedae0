#include "platform/base/TYCounted.h"

#include <gtest/gtest.h>
#include <thread>
#include <vector>

namespace
{
class Object : public TYCounted
{
public:
    explicit Object(unsigned int& ended) : m_ended(ended) {}

private:
    ~Object() override { ++m_ended; }
    unsigned int& m_ended;
};
} // namespace

TEST(TYCounted, TheLastReferenceTakesTheObjectAlong)
{
    unsigned int ended = 0;
    Object const* const object = new Object(ended);
    object->addReference();
    object->addReference();
    object->removeReference();
    EXPECT_EQ(0U, ended);
    object->removeReference();
    EXPECT_EQ(1U, ended);
}

TEST(TYCounted, ReferencesMayBeTakenAndGivenUpOnAnyThread)
{
    unsigned int ended = 0;
    Object const* const object = new Object(ended);
    object->addReference();
    std::vector<std::thread> threads;
    for (unsigned int i = 0; i < 4; ++i)
    {
        object->addReference(); // for the thread, which may be the last
        threads.emplace_back(
            [object]
            {
                for (unsigned int j = 0; j < 1000; ++j)
                {
                    object->addReference();
                    object->removeReference();
                }
                object->removeReference();
            });
    }
    object->removeReference();
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(1U, ended);
}
