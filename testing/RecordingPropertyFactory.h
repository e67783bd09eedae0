#pragma once

#include "properties/CC_PropertyFactory.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <vector>

/// A property factory for the ids that the test names. Makes CC_PropertyString of them unless `m_create` is set, and
/// records each request as "f: create Name".
///
///     RecordingPropertyFactory factory("f", {CC_PropertyId::URI});
///     std::ignore = CallControl::ADD_PROPERTY_FACTORY(&factory);
class RecordingPropertyFactory : public CC_PropertyFactory, public Recorder
{
public:
    /// `journal` must outlive it; null: it keeps one of its own.
    RecordingPropertyFactory(std::string name, std::vector<unsigned int> ids, Journal* journal = nullptr);
    ~RecordingPropertyFactory() override;

    void getPropertyIds(TYVector<unsigned int>& ids) const override;
    CC_Property* createProperty(unsigned int id) override;

    /// Runs inside `createProperty`, after it has been recorded; without it a CC_PropertyString is made.
    Hook<CC_Property*(unsigned int)> m_create;

private:
    std::vector<unsigned int> m_ids;
};
