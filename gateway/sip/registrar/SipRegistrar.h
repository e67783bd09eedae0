#pragma once

#include "configuration/AddressRange.h"
#include "sip/SipConfiguration.h"
#include "sip/registrar/SipBindings.h"
#include "sip/stack/Sofia.h"

#include <memory>
#include <optional>
#include <string>
#include <vector>

class SipBindingStore;

/// Where a user is called: the URI, and through whom, as a Route; empty: nobody.
struct SipContact
{
    std::string uri;
    std::string route;
};

/// Where the users of an interface's realm have registered (RFC 3261, 10.3).
///
/// A user registers himself and nobody else, at addresses that the interface serves. Belongs to the thread of the
/// stack's loop; owned by its interface.
class SipRegistrar
{
public:
    struct Counters
    {
        unsigned long long taken = 0;
        unsigned long long refused = 0;
    };

    /// Throws SipBindingStore::Failure when the file of contacts is of no use.
    explicit SipRegistrar(SipConfiguration const& configuration);
    ~SipRegistrar();
    SipRegistrar(SipRegistrar const&) = delete;
    SipRegistrar& operator=(SipRegistrar const&) = delete;

    /// Answers a REGISTER of that user; the status.
    int receive(nta_incoming_t* transaction, sip_t const* request, std::string const& user);
    /// Whether there is such a user, registered or not.
    bool hasUser(std::string_view user) const;
    /// Where he is called, that first which is to be tried first; empty for one who is not registered.
    std::vector<SipContact> find(std::string_view user) const;
    /// Tells of each contact with its user.
    template <class Visitor>
    void visit(Visitor const& visitor) const
    {
        m_bindings.visit(visitor);
    }
    std::size_t getNumberOfContacts() const { return m_bindings.getNumber(); }
    /// A line for the dump.
    std::string describe() const;

private:
    int take(nta_incoming_t* transaction, sip_t const* request, std::string const& user);
    int readWishes(nta_incoming_t* transaction, sip_t const* request, std::string const& route,
                   std::vector<SipBindings::Wish>& wishes) const;
    bool isServed(url_t const& uri) const;
    bool isOther(url_t const& uri) const;
    void answer(nta_incoming_t* transaction, std::string const& user, std::string const& pathHeader) const;

    SipConfiguration const& m_configuration;
    std::vector<AddressRange> m_served;
    SipBindings m_bindings;
    std::unique_ptr<SipBindingStore> m_store; // null: in memory alone
    Counters m_counters;
};
