#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <string>
#include <string_view>
#include <vector>

/// Where a user was last found: one of his contacts. A plain value.
struct SipBinding
{
    std::string uri;
    std::string callId;
    std::uint32_t sequence = 0;
    unsigned int preference = 1000; ///< thousandths: the contact's q
    long long until = 0;            ///< seconds of the time of day
    std::string called{};           ///< where he is called instead; empty: at the URI
    std::string route{};            ///< through whom, as a Route; empty: nobody
};

/// Which contacts the users of a registrar have, as REGISTER changes them (RFC 3261, 10.3), in memory. One thread.
class SipBindings
{
public:
    /// One contact of a REGISTER.
    struct Wish
    {
        std::string uri;
        unsigned int preference = 1000;
        unsigned int seconds = 0; ///< 0: to be forgotten
        std::string called{};     ///< as SipBinding's, and so is the next
        std::string route{};
    };
    enum Result
    {
        OK,
        REFRESHED,    ///< OK as well, and the user has no contact that he had not before, and none less
        OUT_OF_ORDER, ///< a later request of the same Call-ID was there before
        TOO_MANY
    };

    explicit SipBindings(std::size_t mostOfUser) : m_mostOfUser(mostOfUser) {}

    /// All of it or nothing.
    Result update(std::string const& user, std::vector<Wish> const& wishes, std::string const& callId,
                  std::uint32_t sequence);
    /// "Contact: *"
    Result clear(std::string const& user, std::string const& callId, std::uint32_t sequence);
    /// As it was kept.
    void restore(std::string const& user, SipBinding const& binding) { m_users[user].push_back(binding); }
    /// Those that have not expired, the best liked first, of equals the one that was heard of last.
    std::vector<SipBinding> find(std::string_view user) const;
    /// Tells of each contact that has not expired with its user.
    template <class Visitor>
    void visit(Visitor const& visitor) const
    {
        for (auto const& [user, bindings] : m_users)
            for (SipBinding const& binding : bindings)
                if (binding.until > NOW())
                    visitor(user, binding);
    }
    std::size_t getNumber() const; ///< of contacts that have not expired

    static long long NOW();

private:
    std::size_t m_mostOfUser;
    std::map<std::string, std::vector<SipBinding>, std::less<>> m_users;
};
