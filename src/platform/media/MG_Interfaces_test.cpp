#include "platform/base/TYPtr.h"
#include "platform/media/MG_IContext.h"
#include "platform/media/MG_IContextRepository.h"
#include "platform/media/MG_ITerminationRepository.h"

#include <gtest/gtest.h>
#include <type_traits>

namespace
{
class Context : public MG_IContext
{
public:
    Context(unsigned int id, unsigned int& ended) : m_id(id), m_ended(ended) {}
    unsigned int getId() const override { return m_id; }

private:
    ~Context() override { ++m_ended; }
    unsigned int m_id;
    unsigned int& m_ended;
};

class Repository : public MG_IContextRepository
{
public:
    explicit Repository(unsigned int& ended) : m_ended(ended) {}
    XCode createContext(TYPtr<MG_IContext>& context) override
    {
        context.set(new Context(++m_lastId, m_ended));
        return XCode::OK;
    }

private:
    unsigned int& m_ended;
    unsigned int m_lastId = 0;
};
} // namespace

static_assert(std::is_abstract_v<MG_IContext> && std::is_abstract_v<MG_IContextRepository>);
static_assert(std::is_base_of_v<TYCounted, MG_ITerminationRepository>);

TEST(MG_Interfaces, AContextLivesAsLongAsSomebodyHoldsIt)
{
    unsigned int ended = 0;
    TYPtr<MG_IContextRepository> repository(new Repository(ended));
    TYPtr<MG_IContext> first;
    ASSERT_TRUE(repository->createContext(first).isOk());
    EXPECT_EQ(1U, first->getId());

    TYPtr<MG_IContext> const shared = first;
    ASSERT_TRUE(repository->createContext(first).isOk());
    EXPECT_EQ(2U, first->getId());
    EXPECT_EQ(1U, shared->getId());
    EXPECT_EQ(0U, ended);
    first.set(nullptr);
    EXPECT_EQ(1U, ended);
}
