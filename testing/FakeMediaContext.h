#pragma once

#include "platform/media/MG_IContext.h"

/// A context of the media layer that is nothing but its id. Shared by reference count; make it with `new`.
///
///     TYPtr<MG_IContext> const context(new FakeMediaContext(7));
///     CallControl::ACQUIRE_CALL("SWITCH", context.get());
class FakeMediaContext : public MG_IContext
{
public:
    /// `id`: what `getId` gives; two contexts may have the same.
    explicit FakeMediaContext(unsigned int id) : m_id(id) { ++s_numberOfInstances; }
    ~FakeMediaContext() override;

    unsigned int getId() const override { return m_id; }

    /// The number of fake contexts alive; the leak check counts them too.
    static unsigned int s_numberOfInstances;

private:
    unsigned int m_id;
};
