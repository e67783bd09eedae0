#include "sip/access/SipPasswords.h"

#include "sip/message/SipText.h"

#include <algorithm>
#include <cctype>
#include <fcntl.h>
#include <stdexcept>
#include <sys/stat.h>
#include <unistd.h>

namespace
{
constexpr char const* ANY_REALM = "*";

std::invalid_argument COMPLAINT(std::string const& file, std::string const& reason)
{
    return std::invalid_argument(file + ": " + reason);
}

class Descriptor
{
public:
    explicit Descriptor(std::string const& file) : m_number(open(file.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK)) {}
    ~Descriptor()
    {
        if (m_number >= 0)
            close(m_number);
    }
    Descriptor(Descriptor const&) = delete;
    Descriptor& operator=(Descriptor const&) = delete;
    int get() const { return m_number; }

private:
    int m_number;
};

std::string CONTENTS(int descriptor, std::string const& file)
{
    std::string text;
    char piece[4096];
    ssize_t length = 0;
    while ((length = read(descriptor, piece, sizeof piece)) > 0)
        text.append(piece, static_cast<std::size_t>(length));
    if (length < 0)
        throw COMPLAINT(file, "cannot be read");
    return text;
}

/// "{SHA-256}" at the beginning; it is taken away.
std::optional<SipDigest::Algorithm> TAKE_ALGORITHM(std::string_view& secret)
{
    for (SipDigest::Algorithm const algorithm : {SipDigest::MD5, SipDigest::SHA_256, SipDigest::SHA_512_256})
        if (std::string const mark = std::string("{") + SipDigest::NAME(algorithm) + "}"; secret.starts_with(mark))
        {
            secret.remove_prefix(mark.size());
            return algorithm;
        }
    return std::nullopt;
}

bool IS_HASH(std::string_view text, SipDigest::Algorithm algorithm)
{
    return text.size() == SipDigest::LENGTH(algorithm) &&
           std::all_of(text.begin(), text.end(), [](unsigned char c) { return std::isxdigit(c) != 0; });
}

/// It stands between quotes in headers.
bool IS_NAME(std::string_view text)
{
    return !text.empty() && std::none_of(text.begin(), text.end(),
                                         [](char c) { return SipText::IS_CONTROL(c) || c == '"' || c == '\\'; });
}
} // namespace

std::shared_ptr<SipPasswords const> SipPasswords::READ(std::string const& file)
{
    Descriptor const descriptor(file);
    struct stat status = {};
    if (descriptor.get() < 0 || fstat(descriptor.get(), &status) != 0)
        throw COMPLAINT(file, "cannot be read");
    if (!S_ISREG(status.st_mode))
        throw COMPLAINT(file, "is no file");
    if ((status.st_mode & S_IRWXO) != 0)
        throw COMPLAINT(file, "everybody may read or change it");
    return std::make_shared<SipPasswords const>(PARSE(CONTENTS(descriptor.get(), file), file));
}

SipPasswords SipPasswords::PARSE(std::string_view text, std::string const& name)
{
    SipPasswords passwords;
    for (unsigned int number = 1; !text.empty(); ++number)
    {
        std::string_view line = text.substr(0, text.find('\n'));
        text.remove_prefix(std::min(text.size(), line.size() + 1));
        if (line.ends_with('\r'))
            line.remove_suffix(1);
        if (!line.empty() && line.front() != '#' && !passwords.addLine(line))
            throw COMPLAINT(name, "line " + std::to_string(number) + " is not of the form user:realm:password");
    }
    return passwords;
}

/// False for one that is malformed, or whose password cannot be known twice.
bool SipPasswords::addLine(std::string_view line)
{
    std::size_t const first = line.find(':');
    std::size_t const second = first == std::string_view::npos ? first : line.find(':', first + 1);
    if (second == std::string_view::npos)
        return false;
    std::string const user(line.substr(0, first));
    std::string const realm(line.substr(first + 1, second - first - 1));
    std::string_view secret = line.substr(second + 1);
    std::optional<SipDigest::Algorithm> const algorithm = TAKE_ALGORITHM(secret);
    if (!IS_NAME(user) || !IS_NAME(realm) || secret.empty())
        return false;
    if (algorithm && (realm == ANY_REALM || !IS_HASH(secret, *algorithm)))
        return false;
    std::string text(secret);
    if (algorithm)
        std::transform(text.begin(), text.end(), text.begin(),
                       [](unsigned char c) { return static_cast<char>(std::tolower(c)); });
    m_entries.emplace(std::pair(user, realm), Entry{algorithm, text});
    return true;
}

std::optional<std::string> SipPasswords::find(std::string_view user, std::string_view realm,
                                              SipDigest::Algorithm algorithm) const
{
    for (std::string_view const asked : {realm, std::string_view(ANY_REALM)})
    {
        auto const [begin, end] = m_entries.equal_range(std::pair(std::string(user), std::string(asked)));
        for (auto entry = begin; entry != end; ++entry)
            if (!entry->second.algorithm)
                return SipDigest::SECRET(algorithm, user, realm, entry->second.secret);
            else if (*entry->second.algorithm == algorithm)
                return entry->second.secret;
    }
    return std::nullopt;
}

bool SipPasswords::hasUser(std::string_view user) const
{
    auto const found = m_entries.lower_bound(std::pair(std::string(user), std::string()));
    return found != m_entries.end() && found->first.first == user;
}

bool SipPasswords::hasUser(std::string_view user, std::string_view realm) const
{
    return m_entries.contains(std::pair(std::string(user), std::string(realm)));
}

bool SipPasswords::hasRealm(std::string_view realm) const
{
    return std::any_of(m_entries.begin(), m_entries.end(),
                       [&](auto const& entry) { return entry.first.second == realm; });
}

std::string SipPasswords::findWithout(std::string_view realm, SipDigest::Algorithm algorithm) const
{
    for (auto const& [who, entry] : m_entries)
        if (who.second == realm && !find(who.first, realm, algorithm))
            return who.first;
    return {};
}
