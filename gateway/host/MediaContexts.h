#pragma once

#include "platform/media/MG_IContext.h"
#include "platform/media/MG_IContextRepository.h"
#include "platform/media/MG_ITerminationRepository.h"

/// A media context of this gateway. It carries nothing yet: the session descriptions make the peers exchange their
/// media directly.
class MediaContext : public MG_IContext
{
public:
    explicit MediaContext(unsigned int id) : m_id(id) { ++s_numberOfInstances; }
    ~MediaContext() override { --s_numberOfInstances; }
    unsigned int getId() const override { return m_id; }

    /// The number of contexts alive.
    static unsigned int s_numberOfInstances;

private:
    unsigned int m_id;
};

/// Makes the media contexts and numbers them from 1. On the call-control loop's thread.
///
///     TYPtr<MG_IContextRepository> const repository(new MediaContextRepository);
///     CallControl::SET_MG_CONTEXT_REPOSITORY(repository.get());
class MediaContextRepository : public MG_IContextRepository
{
public:
    XCode createContext(TYPtr<MG_IContext>& context) override;

private:
    unsigned int m_lastId = 0;
};

/// The gateway has no terminations of its own yet.
class MediaTerminationRepository : public MG_ITerminationRepository
{
};
