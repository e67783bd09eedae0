// The module's access to the properties of the own leg, the peer leg and the call.
#include "adapters/CC_CallAdapter.h"
#include "adapters/CC_CallAdapter_Attempt.h"
#include "adapters/CC_CallAdapter_Copy.h"
#include "adapters/CC_CallAdapter_Event.h"
#include "callcontrol/provider/CC_Endpoint.h"
#include "calls/CC_Call.h"
#include "calls/CC_CallLeg.h"
#include "properties/CC_PropertyContextId.h"
#include "properties/CC_PropertyFilterContainer.h"
#include "properties/CC_PropertyId.h"
#include "recorder/CC_FilterNotes.h"
#include "recorder/CC_RecordWriter.h"

#include <tuple>
#include <type_traits>
#include <utility>

namespace
{
using CC_RecordFormat::Writer;

XCode OK_OR_FAILURE(XCode result) { return result.isOk() ? XCode::OK : XCode::FAILURE; }

XCode WRITE(CC_CallLeg& leg, CC_Property const& property) { return OK_OR_FAILURE(leg.setProperty(property)); }
XCode WRITE(CC_CallLeg& leg, CC_PropertyContainer const& many) { return OK_OR_FAILURE(leg.setProperties(many)); }
XCode WRITE(CC_Call& call, CC_Property const& property) { return OK_OR_FAILURE(call.setProperty(property)); }
XCode WRITE(CC_Call& call, CC_PropertyContainer const& many) { return OK_OR_FAILURE(call.setProperties(many)); }
} // namespace

/// The properties as the input filters leave them, in `filtered` if there are filters; null when one of them failed. A
/// filter may have dropped or destroyed the adapter.
CC_PropertyContainer const* CC_CallAdapter::FILTER_INPUT(CC_PropertyFilterContainer const* filters,
                                                         CC_PropertyContainer const& properties,
                                                         CC_PropertyContainer& filtered)
{
    if (filters == nullptr)
        return &properties;
    filtered = properties;
    bool const isComplete =
        filtered.getNumberOfProperties() == properties.getNumberOfProperties(); // else memory is out
    return isComplete && filters->applyFilters(filtered).isOk() ? &filtered : nullptr;
}

/// Writes one property or several to our view and through the input filters to the leg or call. What filters and
/// foreign properties do meanwhile may end the attempt; the caller keeps a target that could go without that.
/// REQUIRES: target != nullptr
template <class Target, class Written>
XCode CC_CallAdapter::writeFiltered(CC_PropertyView& view, Target* target, Written const& written)
{
    Attempt const attempt(*this);
    XCode const seen = view.write(written);
    if (!seen.isOk() || attempt.isOver())
        return XCode::FAILURE;
    CC_PropertyFilterContainer const* const filters = getInputFilters();
    if (filters == nullptr)
        return WRITE(*target, written);
    return writeCopy(attempt, view, *target, *filters);
}

/// Apart, so that a call without filters does not pay for it.
template <class Target>
__attribute__((noinline)) XCode CC_CallAdapter::writeCopy(Attempt const& attempt, CC_PropertyView& view, Target& target,
                                                          CC_PropertyFilterContainer const& filters)
{
    CC_FilterNotes notes;
    CC_Writing const throughFilters(notes);
    Copy const copy(attempt, *this, &view == &m_ownView ? Kept::OWN_INPUT : Kept::OTHER_INPUT, view);
    if (!copy.isWhole() || !filters.applyFilters(copy.get()).isOk() || attempt.isOver())
        return XCode::FAILURE;
    if constexpr (std::is_same_v<Target, CC_CallLeg>)
        return OK_OR_FAILURE(copy.writeTo(target));
    else
        return WRITE(target, copy.get());
}

template <class Target, class Written>
XCode CC_CallAdapter::writeUnfiltered(CC_PropertyView& view, Target* target, Written const& written)
{
    Attempt const attempt(*this);
    XCode const seen = view.write(written);
    return seen.isOk() && !attempt.isOver() ? WRITE(*target, written) : XCode::FAILURE;
}

CC_PropertyFilterContainer* CC_CallAdapter::getInputFilters() const
{
    return m_endpoint != nullptr ? m_endpoint->getInputFilterContainer() : nullptr;
}

CC_PropertyFilterContainer* CC_CallAdapter::getOutputFilters() const
{
    return m_endpoint != nullptr ? m_endpoint->getOutputFilterContainer() : nullptr;
}

// --- own leg ---------------------------------------------------------------------------------------------------------

CC_Property const* CC_CallAdapter::getOwnProperty(unsigned int id) const { return m_ownView.getProperties().get(id); }

CC_Property const* CC_CallAdapter::getOwnPropertyUnfiltered(unsigned int id) const
{
    return m_ownCallLeg != nullptr ? m_ownCallLeg->getProperties().get(id) : nullptr;
}

XCode CC_CallAdapter::getOwnProperties(CC_PropertyContainer& properties, unsigned int mask) const
{
    return properties.setEach(m_ownView.getProperties(), mask);
}

XCode CC_CallAdapter::getOwnPropertiesUnfiltered(CC_PropertyContainer& properties, unsigned int mask) const
{
    return m_ownCallLeg != nullptr ? properties.setEach(m_ownCallLeg->getProperties(), mask) : XCode::ABSENT;
}

XCode CC_CallAdapter::setOwnProperty(CC_Property const& property)
{
    if (m_ownCallLeg == nullptr || getInputFilters() != nullptr)
        return writeOwn(property, true);
    return CC_RecordWriter::ON() == nullptr ? setOwnPropertyPlainly(property) : setOwnPropertyRecorded(property);
}

/// Apart, so that who does not record does not pay for it.
__attribute__((noinline)) XCode CC_CallAdapter::setOwnPropertyRecorded(CC_Property const& property)
{
    CC_Writing::Recorded const writing(Writer::OWN, *m_ownCallLeg);
    return setOwnPropertyPlainly(property);
}

/// Without filters.
XCode CC_CallAdapter::setOwnPropertyPlainly(CC_Property const& property)
{
    // what the leg then tells us of our own write is in our view already (5 % of a call's instructions)
    Attempt const attempt(*this);
    XCode const seen = m_ownView.write(property);
    if (!seen.isOk() || attempt.isOver())
        return XCode::FAILURE;
    m_isWritingOwn = true;
    XCode const result = WRITE(*m_ownCallLeg, property);
    if (!attempt.isOver())
        m_isWritingOwn = false;
    return result;
}

XCode CC_CallAdapter::setOwnProperties(CC_PropertyContainer const& properties) { return writeOwn(properties, true); }

XCode CC_CallAdapter::setOwnPropertyUnfiltered(CC_Property const& property) { return writeOwn(property, false); }

XCode CC_CallAdapter::setOwnPropertiesUnfiltered(CC_PropertyContainer const& properties)
{
    return writeOwn(properties, false);
}

template <class Written>
XCode CC_CallAdapter::writeOwn(Written const& written, bool isFiltered)
{
    if (m_ownCallLeg == nullptr)
        return XCode::ABSENT;
    CC_Writing const writing(Writer::OWN, *m_ownCallLeg);
    return isFiltered ? writeFiltered(m_ownView, m_ownCallLeg, written)
                      : writeUnfiltered(m_ownView, m_ownCallLeg, written);
}

// --- peer leg --------------------------------------------------------------------------------------------------------

CC_Property const* CC_CallAdapter::getPeerProperty(unsigned int id) const { return m_peerView.getProperties().get(id); }

CC_Property const* CC_CallAdapter::getPeerPropertyUnfiltered(unsigned int id) const
{
    return m_peerCallLeg != nullptr ? m_peerCallLeg->getProperties().get(id) : nullptr;
}

XCode CC_CallAdapter::getPeerProperties(CC_PropertyContainer& properties, unsigned int mask) const
{
    return properties.setEach(m_peerView.getProperties(), mask);
}

XCode CC_CallAdapter::getPeerPropertiesUnfiltered(CC_PropertyContainer& properties, unsigned int mask) const
{
    return m_peerCallLeg != nullptr ? properties.setEach(m_peerCallLeg->getProperties(), mask) : XCode::ABSENT;
}

namespace
{
bool HAS_STATE(CC_Property const& property) { return property.getId() == CC_PropertyId::STATE; }
bool HAS_STATE(CC_PropertyContainer const& properties) { return properties.get(CC_PropertyId::STATE) != nullptr; }
} // namespace

/// A State that is written to our view of the peer is what the peer was last seen in, so that its fall does not show
/// when the leg tells it.
template <class Written>
XCode CC_CallAdapter::writePeer(Written const& written, bool isFiltered)
{
    if (m_peerCallLeg == nullptr || m_ownCallLeg == nullptr) // which goes first: what ends with it writes nothing
        return XCode::ABSENT;
    CC_CallLeg::Reference const keepPeer(*m_peerCallLeg);
    if (HAS_STATE(written))
    {
        m_isPeerToBeChosen = true;
        std::ignore = m_peerChangeEvent->setIfNotPending(); // fails only for an event that was destroyed
    }
    CC_Writing const writing(Writer::PEER, *m_ownCallLeg);
    return isFiltered ? writeFiltered(m_peerView, m_peerCallLeg, written)
                      : writeUnfiltered(m_peerView, m_peerCallLeg, written);
}

XCode CC_CallAdapter::setPeerProperty(CC_Property const& property) { return writePeer(property, true); }

XCode CC_CallAdapter::setPeerProperties(CC_PropertyContainer const& properties) { return writePeer(properties, true); }

XCode CC_CallAdapter::setPeerPropertyUnfiltered(CC_Property const& property) { return writePeer(property, false); }

XCode CC_CallAdapter::setPeerPropertiesUnfiltered(CC_PropertyContainer const& properties)
{
    return writePeer(properties, false);
}

// --- call ------------------------------------------------------------------------------------------------------------

CC_Property const* CC_CallAdapter::getCallProperty(unsigned int id) const { return m_callView.getProperties().get(id); }

CC_Property const* CC_CallAdapter::getCallPropertyUnfiltered(unsigned int id) const
{
    CC_Call const* const call = getCall();
    return call != nullptr ? call->getProperties().get(id) : nullptr;
}

XCode CC_CallAdapter::getCallProperties(CC_PropertyContainer& properties, unsigned int mask) const
{
    return properties.setEach(m_callView.getProperties(), mask);
}

XCode CC_CallAdapter::getCallPropertiesUnfiltered(CC_PropertyContainer& properties, unsigned int mask) const
{
    CC_Call const* const call = getCall();
    return call != nullptr ? properties.setEach(call->getProperties(), mask) : XCode::ABSENT;
}

template <class Written>
XCode CC_CallAdapter::writeCall(Written const& written, bool isFiltered)
{
    CC_Call::Hold const keepCall(getCall());
    if (keepCall.get() == nullptr)
        return XCode::ABSENT;
    CC_Writing const writing(Writer::CALL, *m_ownCallLeg);
    return isFiltered ? writeFiltered(m_callView, keepCall.get(), written)
                      : writeUnfiltered(m_callView, keepCall.get(), written);
}

XCode CC_CallAdapter::setCallProperty(CC_Property const& property) { return writeCall(property, true); }

XCode CC_CallAdapter::setCallProperties(CC_PropertyContainer const& properties) { return writeCall(properties, true); }

XCode CC_CallAdapter::setCallPropertyUnfiltered(CC_Property const& property) { return writeCall(property, false); }

XCode CC_CallAdapter::setCallPropertiesUnfiltered(CC_PropertyContainer const& properties)
{
    return writeCall(properties, false);
}

// --- media context ---------------------------------------------------------------------------------------------------

void CC_CallAdapter::setDatapathContext(MG_IContext* context)
{
    TYLifeline::Watch const self(m_lifeline);
    CC_PropertyContextId const property(CC_PropertyId::CONTEXT, context); // null asks the media layer for one
    if (self.isAlive())
        std::ignore = setCallProperty(property); // reports nothing
}

MG_IContext* CC_CallAdapter::getDatapathContext()
{
    return const_cast<MG_IContext*>(std::as_const(*this).getDatapathContext());
}

MG_IContext const* CC_CallAdapter::getDatapathContext() const
{
    auto const* const context = CC_PropertyContextId::FROM(getCallPropertyUnfiltered(CC_PropertyId::CONTEXT));
    return context != nullptr ? context->getContext() : nullptr;
}
