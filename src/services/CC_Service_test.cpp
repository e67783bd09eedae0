#include "services/CC_Service.h"

#include "services/CC_ServiceBlindTransfer.h"
#include "services/CC_ServiceBlindTransferStatus.h"
#include "services/CC_ServiceConferenceRefer.h"
#include "services/CC_ServicePushBack.h"
#include "services/CC_ServiceUserInput.h"
#include "services/CC_ServiceUserInputUpdate.h"
#include "tests/support/ServiceTesting.h"

#include <cstddef>
#include <cstring>
#include <gtest/gtest.h>
#include <set>

namespace
{
// before main, for every test may be the first to ask
unsigned int const FIRST_ASKED = CC_ServicePushBack::TYPE();
unsigned int const SECOND_ASKED = CC_Service::TYPE();

/// A service as a module would write it.
class Hook : public CC_ServiceClass<Hook>
{
public:
    static unsigned int TYPE()
    {
        static unsigned int s_type = INVALID_TYPE();
        return KEEP_TYPE(s_type);
    }
    String getInfo() const override { return "Hook"; }
    InfoContainer& getInfo(InfoContainer& info, unsigned int, unsigned int, unsigned int, unsigned int,
                           String const&) const override
    {
        return info;
    }
};

template <class Operation>
std::size_t SLOT_OF(Operation operation)
{
    std::size_t parts[2]; // the offset in the table plus one, and the adjustment of the object's address
    static_assert(sizeof operation == sizeof parts);
    std::memcpy(parts, &operation, sizeof parts);
    return (parts[0] - 1) / sizeof(void*);
}
} // namespace

TEST(CC_Service, TypeNumbersCountUpInTheOrderOfAsking)
{
    unsigned int const before = CC_Service::ACQUIRE_TYPE();
    unsigned int const hook = Hook::TYPE();
    EXPECT_EQ(before + 1, hook);
    EXPECT_EQ(before + 2, CC_Service::ACQUIRE_TYPE());
    EXPECT_EQ(hook, Hook::TYPE());
    EXPECT_EQ(0xffffffffU, CC_Service::INVALID_TYPE());
}

TEST(CC_Service, TheFirstClassAskedGetsNumberZero)
{
    EXPECT_EQ(0U, FIRST_ASKED);
    EXPECT_EQ(1U, SECOND_ASKED);
}

TEST(CC_Service, EveryClassHasANumberOfItsOwn)
{
    std::set<unsigned int> const types = {CC_Service::TYPE(),
                                          CC_ServiceBlindTransfer::TYPE(),
                                          CC_ServiceBlindTransferStatus::TYPE(),
                                          CC_ServiceConferenceRefer::TYPE(),
                                          CC_ServicePushBack::TYPE(),
                                          CC_ServiceUserInput::TYPE(),
                                          CC_ServiceUserInputUpdate::TYPE()};
    EXPECT_EQ(7U, types.size());
    EXPECT_EQ(0U, types.count(CC_Service::INVALID_TYPE()));
}

TEST(CC_Service, EveryServiceIsOfItsOwnClassAndOfTheBase)
{
    CC_ServiceBlindTransfer const transfer("*7", "12");
    CC_ServiceBlindTransferStatus const status(QCause::USER_BUSY);
    CC_ServiceConferenceRefer const refer("x");
    CC_ServicePushBack const pushBack(5);
    CC_ServiceUserInput const input("12");
    Hook const hook;
    for (CC_Service const* const service :
         {static_cast<CC_Service const*>(&transfer), static_cast<CC_Service const*>(&status),
          static_cast<CC_Service const*>(&refer), static_cast<CC_Service const*>(&pushBack),
          static_cast<CC_Service const*>(&input), static_cast<CC_Service const*>(&hook)})
    {
        EXPECT_TRUE(service->isOfType(service->type()));
        EXPECT_TRUE(service->isOfType(CC_Service::TYPE()));
        EXPECT_FALSE(service->isOfType(CC_Service::INVALID_TYPE()));
        EXPECT_EQ(service == &pushBack, service->isOfType(CC_ServicePushBack::TYPE()));
        EXPECT_EQ(service == &hook, service->isOfType(Hook::TYPE()));
    }
    EXPECT_EQ(CC_ServicePushBack::TYPE(), pushBack.type());
}

// modules are compiled against this order: operations are appended, never inserted
TEST(CC_Service, VirtualOperationsKeepTheirSlots)
{
    using Line = String (CC_Service::*)() const;
    using Tree = InfoContainer& (CC_Service::*)(InfoContainer&, unsigned int, unsigned int, unsigned int, unsigned int,
                                                String const&) const;
    std::size_t const first = SLOT_OF(&CC_Service::type); // behind the destructor
    EXPECT_EQ(first + 1, SLOT_OF(&CC_Service::isOfType));
    EXPECT_EQ(first + 2, SLOT_OF(static_cast<Line>(&CC_Service::getInfo)));
    EXPECT_EQ(first + 3, SLOT_OF(static_cast<Tree>(&CC_Service::getInfo)));
}
