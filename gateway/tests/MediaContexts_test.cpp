#include "host/MediaContexts.h"

#include <gtest/gtest.h>

TEST(MediaContexts, AreNumberedFromOneAndCounted)
{
    TYPtr<MediaContextRepository> const repository(new MediaContextRepository);
    TYPtr<MG_IContext> first;
    TYPtr<MG_IContext> second;
    EXPECT_TRUE(repository->createContext(first).isOk());
    EXPECT_TRUE(repository->createContext(second).isOk());
    EXPECT_EQ(first->getId(), 1u);
    EXPECT_EQ(second->getId(), 2u);
    EXPECT_EQ(MediaContext::s_numberOfInstances, 2u);
    first.set(nullptr);
    EXPECT_EQ(MediaContext::s_numberOfInstances, 1u);
    second.set(nullptr);
    EXPECT_EQ(MediaContext::s_numberOfInstances, 0u);
}
