// What the module for SIP counts, for the gateway's figures.
#include "host/MetricText.h"
#include "sip/SipModule.h"

namespace
{
/// What the stack has counted at one interface since its start.
struct StackCounters
{
    explicit StackCounters(nta_agent_t* agent)
    {
        nta_agent_get_stats(agent, NTATAG_S_RECV_REQUEST_REF(receivedRequests),
                            NTATAG_S_RECV_RESPONSE_REF(receivedResponses), NTATAG_S_SENT_REQUEST_REF(sentRequests),
                            NTATAG_S_SENT_RESPONSE_REF(sentResponses), NTATAG_S_RETRY_REQUEST_REF(repeatedRequests),
                            NTATAG_S_RETRY_RESPONSE_REF(repeatedResponses), NTATAG_S_RECV_RETRY_REF(heardAgain),
                            NTATAG_S_BAD_MESSAGE_REF(malformed), NTATAG_S_TOUT_REQUEST_REF(unanswered), TAG_END());
    }

    usize_t receivedRequests = 0;
    usize_t receivedResponses = 0;
    usize_t sentRequests = 0;
    usize_t sentResponses = 0;
    usize_t repeatedRequests = 0;
    usize_t repeatedResponses = 0;
    usize_t heardAgain = 0;
    usize_t malformed = 0;
    usize_t unanswered = 0;
};

void ADD_LOGINS(MetricText& text, std::string_view name, SipAuthentication::Counters const& counters)
{
    std::pair<std::string_view, unsigned long long> const results[] = {
        {"known", counters.accepted},  {"asked", counters.asked},        {"wrong", counters.wrong},
        {"stale", counters.stale},     {"replayed", counters.replayed},  {"moved", counters.moved},
        {"ignored", counters.ignored}, {"emergency", counters.emergency}};
    for (auto const& [result, number] : results)
        text.add(number, {{"interface", name}, {"result", result}});
}
} // namespace

template <class Get>
void SipModule::addOfEach(MetricText& text, Get const& get) const
{
    for (auto const& port : m_ports)
        text.add(get(port->interface), {{"interface", port->interface.getName().view()}});
}

void SipModule::addMetrics(MetricText& text) const
{
    std::vector<std::pair<std::string_view, StackCounters>> all;
    for (auto const& port : m_ports)
        all.emplace_back(port->interface.getName().view(), StackCounters(port->interface.getAgent()));
    auto const addPair = [&](usize_t StackCounters::*requests, usize_t StackCounters::*responses)
    {
        for (auto const& [name, counters] : all)
        {
            text.add(counters.*requests, {{"interface", name}, {"kind", "request"}});
            text.add(counters.*responses, {{"interface", name}, {"kind", "response"}});
        }
    };
    auto const addOne = [&](usize_t StackCounters::*member)
    {
        for (auto const& [name, counters] : all)
            text.add(counters.*member, {{"interface", name}});
    };
    text.begin("sip_messages_received_total", MetricText::COUNTER, "SIP messages that came in");
    addPair(&StackCounters::receivedRequests, &StackCounters::receivedResponses);
    text.begin("sip_messages_sent_total", MetricText::COUNTER, "SIP messages that went out, the first time");
    addPair(&StackCounters::sentRequests, &StackCounters::sentResponses);
    text.begin("sip_messages_repeated_total", MetricText::COUNTER, "SIP messages that went out again");
    addPair(&StackCounters::repeatedRequests, &StackCounters::repeatedResponses);
    text.begin("sip_requests_heard_again_total", MetricText::COUNTER, "SIP requests that came in again");
    addOne(&StackCounters::heardAgain);
    text.begin("sip_requests_unanswered_total", MetricText::COUNTER, "SIP requests that no peer answered in time");
    addOne(&StackCounters::unanswered);
    text.begin("sip_malformed_messages_total", MetricText::COUNTER, "What came in and is no SIP message");
    addOne(&StackCounters::malformed);
    addGuarded(text);
    addUsers(text);
}

void SipModule::addGuarded(MetricText& text) const
{
    text.begin("sip_strange_messages_total", MetricText::COUNTER, "SIP messages from where none are taken");
    addOfEach(text, [](SipInterface const& one) { return one.getGuard().getCounters().strangers; });
    text.begin("sip_large_messages_total", MetricText::COUNTER, "SIP messages that were too large");
    addOfEach(text, [](SipInterface const& one) { return one.getGuard().getCounters().tooLarge; });
    text.begin("sip_requests_dropped_total", MetricText::COUNTER, "SIP requests beyond what an address may send");
    addOfEach(text, [](SipInterface const& one) { return one.getRequestRate().getNumberOfRefused(); });
    text.begin("sip_connections_refused_total", MetricText::COUNTER, "Connections that were not taken");
    addOfEach(text, [](SipInterface const& one) { return one.getGuard().getNumberOfRefused(); });
}

void SipModule::addUsers(MetricText& text) const
{
    text.begin("sip_authenticated_requests_total", MetricText::COUNTER, "SIP requests by what their credentials were");
    for (auto const& port : m_ports)
        if (SipAuthentication const* const authentication = port->interface.getAuthentication())
            ADD_LOGINS(text, port->interface.getName().view(), authentication->getCounters());
    text.begin("sip_contacts", MetricText::GAUGE, "Contacts of users who have registered");
    for (auto const& port : m_ports)
        if (SipRegistrar const* const registrar = port->interface.getRegistrar())
            text.add(registrar->getNumberOfContacts(), {{"interface", port->interface.getName().view()}});
    text.begin("sip_registered", MetricText::GAUGE, "1 where the interface is registered with its peer");
    for (auto const& port : m_ports)
        if (SipRegistration const* const registration = port->interface.getRegistration())
            text.add(registration->isBound() ? 1 : 0, {{"interface", port->interface.getName().view()}});
}
