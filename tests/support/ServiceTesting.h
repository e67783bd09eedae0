#pragma once

#include "services/CC_Service.h"
#include "testing/FailingAllocator.h"

#include <gtest/gtest.h>
#include <string>

// What the tests of the services share.

/// The service in one line.
inline std::string LINE_OF(CC_Service const& service) { return service.getInfo().c_str(); }

/// The service's dump with its own line at level 0.
inline std::string DUMP(CC_Service const& service, unsigned int maxLevel, char const* prefix = "")
{
    InfoContainer info;
    EXPECT_EQ(&info, &service.getInfo(info, maxLevel, 0, 0, 0, prefix));
    return info.getString_TreeFormat().c_str();
}

/// Dumps that are too deep or too fine add nothing, and details stand at the head's own.
inline void EXPECT_LIMITS_KEPT(CC_Service const& service)
{
    InfoContainer info;
    service.getInfo(info, 1, 2, 9, 0, "");
    service.getInfo(info, 9, 0, 1, 2, "");
    EXPECT_EQ(0U, info.getNumberOfEntries());
    service.getInfo(info, 9, 3, 4, 4, "");
    for (unsigned int i = 0; i < info.getNumberOfEntries(); ++i)
    {
        EXPECT_EQ(i == 0 ? 3U : 4U, info.getEntry(i).level);
        EXPECT_EQ(4U, info.getEntry(i).detail);
    }
}

/// Neither text throws when memory is out: the line is then empty, and a dump says that something is missing.
inline void EXPECT_NO_THROW_WITHOUT_MEMORY(CC_Service const& service)
{
    String line;
    for (unsigned long n = 1;; ++n)
    {
        FailingAllocator::failNth(n);
        line = service.getInfo();
        FailingAllocator::stop();
        if (!FailingAllocator::hasFailed())
            break;
        EXPECT_TRUE(line.isEmpty()) << n;
    }
    EXPECT_FALSE(line.isEmpty());

    String const prefix("a prefix that needs memory ");
    InfoContainer const* complete = nullptr;
    for (unsigned long n = 1; complete == nullptr; ++n)
    {
        auto* const info = new InfoContainer;
        FailingAllocator::failNth(n);
        service.getInfo(*info, 9, 0, 9, 0, prefix);
        FailingAllocator::stop();
        bool isMarked = info->isIncomplete();
        for (unsigned int i = 0; i < info->getNumberOfEntries(); ++i)
            isMarked = isMarked || info->getEntry(i).text == "(out of memory)";
        EXPECT_EQ(FailingAllocator::hasFailed(), isMarked) << n;
        if (FailingAllocator::hasFailed())
            delete info;
        else
            complete = info;
    }
    delete complete;
}
