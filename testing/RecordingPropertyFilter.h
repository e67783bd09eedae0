#pragma once

#include "properties/CC_PropertyFilter.h"
#include "testing/Hook.h"
#include "testing/Recorder.h"

#include <memory>

/// A property filter that does what the test says. Filter containers keep clones of what they are given: a filter and
/// its clones share the hook, the counts and the journal, in which each use stands as "f: apply (Name, State)".
///
///     RecordingPropertyFilter hideName("f");
///     hideName.onApply([](CC_PropertyContainer& properties) { ... return XCode::OK; });
///     CC_PropertyFilterContainer filters;
///     std::ignore = filters.addFilter(hideName);
class RecordingPropertyFilter : public CC_PropertyFilter
{
public:
    /// `journal` must outlive the filter and its clones; null: they keep one of their own.
    explicit RecordingPropertyFilter(std::string name, Journal* journal = nullptr);
    /// What `clone` makes; it counts as alive.
    RecordingPropertyFilter(RecordingPropertyFilter const& other);
    RecordingPropertyFilter& operator=(RecordingPropertyFilter const&) = delete;
    ~RecordingPropertyFilter() override;

    /// Null while clones are refused.
    CC_PropertyFilter* clone() const override;
    /// Records the ids in the container, then answers what the hook does; OK without one.
    XCode apply(CC_PropertyContainer& properties) const override;
    /// One line: "Filter" and the name.
    InfoContainer& getInfo(InfoContainer& info, unsigned int maxLevel, unsigned int level, unsigned int maxDetail,
                           unsigned int detail, String const& prefix) const override;

    /// Sets the hook, of the clones, too.
    template <class Function>
    void onApply(Function&& function)
    {
        m_shared->apply = std::forward<Function>(function);
    }
    /// From now on, of the clones, too.
    void refuseClones(bool isRefusing) { m_shared->isRefusing = isRefusing; }
    /// Clones made of the filter and its clones so far, and filters (clones included) alive. @{
    unsigned int getNumberOfClones() const { return m_shared->clones; }
    unsigned int getNumberAlive() const { return m_shared->alive; }
    /// @}
    /// The lines since the last time, those of the clones included.
    Lines take() { return m_shared->take(); }

private:
    struct Shared : Recorder
    {
        using Recorder::record;
        using Recorder::Recorder;
        Hook<XCode(CC_PropertyContainer&)> apply;
        unsigned int clones = 0;
        unsigned int alive = 1;
        bool isRefusing = false;
    };
    std::shared_ptr<Shared> m_shared;
};
