#include "properties/CC_PropertyContextId.h"

#include "properties/CC_PropertyId.h"
#include "testing/FakeMediaContext.h"
#include "testing/FakeMediaContextRepository.h"
#include "tests/support/PropertyTesting.h"

#include <gtest/gtest.h>
#include <memory>

TEST(CC_PropertyContextId, WithoutARepositoryItHasNoContext)
{
    CC_PropertyContextId property(CC_PropertyId::CONTEXT);
    EXPECT_EQ("(none)", VALUE_OF(property));
    EXPECT_EQ(nullptr, property.getContext());
    EXPECT_EQ("Invalid value", REFUSAL_OF(property, "0x00000001"));
    EXPECT_TRUE(property.isEqual(CC_PropertyContextId(CC_PropertyId::CONTEXT)));
}

TEST(CC_PropertyContextId, AsksTheRepositoryUnlessAContextIsGiven)
{
    FakeMediaContextRepository repository;
    CC_PropertyContextId const made(CC_PropertyId::CONTEXT);
    EXPECT_EQ(1U, repository.getNumberOfRequests());
    EXPECT_EQ("0x00000001", VALUE_OF(made));
    CC_PropertyContextId const again(CC_PropertyId::CONTEXT, nullptr);
    EXPECT_EQ(2U, repository.getNumberOfRequests());
    EXPECT_EQ("0x00000002", VALUE_OF(again));
    CC_PropertyContextId const given(CC_PropertyId::CONTEXT, made.getContext());
    EXPECT_EQ(2U, repository.getNumberOfRequests());
    EXPECT_EQ(made.getContext(), given.getContext());
}

TEST(CC_PropertyContextId, CopiesShareTheContextAndAskNobody)
{
    FakeMediaContextRepository repository;
    CC_PropertyContextId const made(CC_PropertyId::CONTEXT);
    CC_PropertyContextId const copy(made);
    std::unique_ptr<CC_Property> const clone(made.clone());
    CC_PropertyContextId assigned(CC_PropertyId::CONTEXT, copy.getContext());
    assigned.assign(made);
    assigned = made;
    EXPECT_EQ(1U, repository.getNumberOfRequests());
    EXPECT_EQ(1U, FakeMediaContext::s_numberOfInstances);
    EXPECT_TRUE(made.isEqual(copy));
    EXPECT_TRUE(made.isEqual(*clone));
    EXPECT_TRUE(made.isEqual(assigned));
}

TEST(CC_PropertyContextId, CopiesOfAnEmptyOneStayEmpty)
{
    CC_PropertyContextId const empty(CC_PropertyId::CONTEXT);
    FakeMediaContextRepository repository;
    CC_PropertyContextId const copy(empty);
    std::unique_ptr<CC_Property> const clone(empty.clone());
    EXPECT_EQ("(none)", VALUE_OF(copy));
    EXPECT_EQ("(none)", VALUE_OF(*clone));
    EXPECT_EQ(0U, repository.getNumberOfRequests());
}

TEST(CC_PropertyContextId, HoldsItsContextUntilAnotherTakesItsPlace)
{
    {
        CC_PropertyContextId property(CC_PropertyId::CONTEXT, new FakeMediaContext(0xabcdef01));
        EXPECT_EQ("0xabcdef01", VALUE_OF(property));
        EXPECT_EQ(1U, FakeMediaContext::s_numberOfInstances);
        property.setContext(new FakeMediaContext(2));
        EXPECT_EQ("0x00000002", VALUE_OF(property));
        EXPECT_EQ(1U, FakeMediaContext::s_numberOfInstances);
        property.setContext(property.getContext());
        EXPECT_EQ("0x00000002", VALUE_OF(property));
    }
    EXPECT_EQ(0U, FakeMediaContext::s_numberOfInstances);
}

TEST(CC_PropertyContextId, TheSameContextIsTheSameObject)
{
    CC_PropertyContextId const first(CC_PropertyId::CONTEXT, new FakeMediaContext(1));
    CC_PropertyContextId const twin(CC_PropertyId::CONTEXT, new FakeMediaContext(1));
    EXPECT_FALSE(first.isEqual(twin));
    EXPECT_TRUE(first.isEqual(CC_PropertyContextId(CC_PropertyId::CONTEXT, first.getContext())));
}

TEST(CC_PropertyContextId, SettingNullAsksForANewContext)
{
    CC_PropertyContextId property(CC_PropertyId::CONTEXT, new FakeMediaContext(9));
    property.setContext(nullptr); // nobody to ask
    EXPECT_EQ("0x00000009", VALUE_OF(property));

    FakeMediaContextRepository repository;
    repository.setFailing(true);
    property.setContext(nullptr);
    EXPECT_EQ("0x00000009", VALUE_OF(property));
    repository.setFailing(false);
    property.setContext(nullptr);
    EXPECT_EQ("0x00000001", VALUE_OF(property));
    EXPECT_EQ(1U, FakeMediaContext::s_numberOfInstances);
}
