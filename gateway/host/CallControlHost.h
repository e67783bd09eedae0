#pragma once

#include "host/RebootLock.h"
#include "platform/base/TYPtr.h"
#include "properties/CC_Factory.h"

class CC_Provider;
class MediaLayer;
class TYEventLoop;

/// Sets up call control for this process as long as it lives: event loops, media repositories, the property factory,
/// the reboot management and one context. The reverse at its end, after what is still pending has run.
///
///     TYEventLoop callControl, datapath;
///     CallControlHost host(callControl, datapath, "SWITCH");
class CallControlHost
{
public:
    /// The loops must outlive the host, and so must the media layer, if there is one: else media do not go through
    /// this process. Throws std::runtime_error when memory is out or the context exists.
    CallControlHost(TYEventLoop& callControl, TYEventLoop& datapath, String const& contextName,
                    MediaLayer* media = nullptr);
    ~CallControlHost();
    CallControlHost(CallControlHost const&) = delete;
    CallControlHost& operator=(CallControlHost const&) = delete;

    /// A provider in the context of that name, as long as this lives.
    class Registration
    {
    public:
        /// Throws std::runtime_error when the name is taken or memory is out.
        Registration(String const& contextName, String const& name, CC_Provider& provider);
        ~Registration();
        Registration(Registration const&) = delete;
        Registration& operator=(Registration const&) = delete;

    private:
        String m_contextName;
        String m_name;
    };

    String const& getContextName() const { return m_contextName; }

private:
    void runPending();

    TYEventLoop& m_callControl;
    String m_contextName;
    CC_Factory m_factory;
    TYPtr<RebootLock> m_rebootLock;
};
