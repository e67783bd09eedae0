#pragma once

#include "sip/access/SipDigest.h"

#include <map>
#include <memory>
#include <optional>
#include <string>
#include <string_view>
#include <utility>

/// A file of users and passwords, read once:
///
///     # user : realm : password, or its hash
///     4989123:provider.example:open sesame
///     alice:office:{SHA-256}6f3b...   (of "alice:office:her password")
///     bob:*:guess                     (whatever the realm; never a hash, which is of one realm)
///
/// Nobody but its owner and its group may read it. Its contents are in no message and no log.
class SipPasswords
{
public:
    /// Throws std::invalid_argument with the file, the line if it is one, and the reason.
    static std::shared_ptr<SipPasswords const> READ(std::string const& file);
    /// The file's text alone; `name` is for errors.
    static SipPasswords PARSE(std::string_view text, std::string const& name);

    /// The hash that stands for the password of that user in that realm; nothing where there is none, or only that of
    /// another algorithm.
    std::optional<std::string> find(std::string_view user, std::string_view realm,
                                    SipDigest::Algorithm algorithm) const;
    bool hasUser(std::string_view user) const; ///< in whatever realm
    /// The same in that realm and no other.
    bool hasUser(std::string_view user, std::string_view realm) const;
    bool hasRealm(std::string_view realm) const;
    /// A user of that realm whom the algorithm is of no use for; empty: there is none.
    std::string findWithout(std::string_view realm, SipDigest::Algorithm algorithm) const;

private:
    struct Entry
    {
        std::optional<SipDigest::Algorithm> algorithm; // of the hash; nothing: a password
        std::string secret;
    };

    bool addLine(std::string_view line);

    std::multimap<std::pair<std::string, std::string>, Entry, std::less<>> m_entries; // by user and realm
};
