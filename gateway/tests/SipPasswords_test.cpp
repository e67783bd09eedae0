#include "sip/access/SipPasswords.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fcntl.h>
#include <stdexcept>
#include <sys/stat.h>
#include <unistd.h>

namespace
{
std::string const HASH(64, 'A');

/// A file of that text, gone at the end.
class File
{
public:
    File(std::string const& text, mode_t mode)
    {
        int const descriptor = mkstemp(m_name.data());
        EXPECT_EQ(write(descriptor, text.data(), text.size()), static_cast<ssize_t>(text.size()));
        EXPECT_EQ(fchmod(descriptor, mode), 0);
        close(descriptor);
    }
    ~File() { unlink(m_name.c_str()); }
    File(File const&) = delete;
    File& operator=(File const&) = delete;
    std::string const& getName() const { return m_name; }

private:
    std::string m_name = "/tmp/passwords.XXXXXX";
};

template <class Read>
std::string COMPLAINT(Read const& read)
{
    try
    {
        read();
    }
    catch (std::invalid_argument const& error)
    {
        return error.what();
    }
    return "none";
}

std::string COMPLAINT_ABOUT(std::string const& line)
{
    return COMPLAINT([&] { SipPasswords::PARSE("# users\n\n" + line + "\n", "f"); });
}
} // namespace

TEST(SipPasswords, APasswordIsOfItsUserAndRealm)
{
    SipPasswords const passwords = SipPasswords::PARSE("# all of them\r\nalice:office:open:sesame\r\n\nbob:*:x", "f");
    EXPECT_EQ(passwords.find("alice", "office", SipDigest::MD5),
              SipDigest::SECRET(SipDigest::MD5, "alice", "office", "open:sesame"));
    EXPECT_EQ(passwords.find("alice", "elsewhere", SipDigest::MD5), std::nullopt);
    EXPECT_EQ(passwords.find("carol", "office", SipDigest::MD5), std::nullopt);
    EXPECT_EQ(passwords.find("bob", "anywhere", SipDigest::SHA_256),
              SipDigest::SECRET(SipDigest::SHA_256, "bob", "anywhere", "x"));
}

TEST(SipPasswords, AHashIsOfItsAlgorithmAlone)
{
    SipPasswords const passwords =
        SipPasswords::PARSE("a:r:{SHA-256}" + HASH + "\na:r:{MD5}" + HASH.substr(32) + "\n", "f");
    EXPECT_EQ(passwords.find("a", "r", SipDigest::SHA_256), std::string(64, 'a'));
    EXPECT_EQ(passwords.find("a", "r", SipDigest::MD5), std::string(32, 'a'));
    EXPECT_EQ(passwords.find("a", "r", SipDigest::SHA_512_256), std::nullopt);
}

TEST(SipPasswords, WhoIsInTheFile)
{
    SipPasswords const passwords = SipPasswords::PARSE("alice:office:x\nbob:*:y", "f");
    EXPECT_TRUE(passwords.hasUser("alice"));
    EXPECT_TRUE(passwords.hasUser("alice", "office"));
    EXPECT_FALSE(passwords.hasUser("alice", "home"));
    EXPECT_FALSE(passwords.hasUser("bob", "office"));
    EXPECT_FALSE(passwords.hasUser("ali"));
    EXPECT_FALSE(passwords.hasUser("zoe"));
}

TEST(SipPasswords, WhatIsMalformedIsNamedByItsLineAlone)
{
    std::string const complaint = "f: line 3 is not of the form user:realm:password";
    for (std::string const line :
         {"secret", "alice:secret", ":r:secret", "a::secret", "a:r:", "a\"b:r:secret", "a:r\\:secret", "a:r:{MD5}abc",
          "a:r:{SHA-256}zz", "a:*:{MD5}00112233445566778899aabbccddeeff", "a\tb:r:secret"})
        EXPECT_EQ(COMPLAINT_ABOUT(line), complaint) << line;
}

TEST(SipPasswords, AFileThatEverybodyReadsIsRefused)
{
    for (mode_t const mode : {0600u, 0640u, 0400u})
        EXPECT_TRUE(SipPasswords::READ(File("a:r:x", mode).getName())->hasUser("a"));
    for (mode_t const mode : {0644u, 0602u, 0601u})
    {
        File const file("a:r:x", mode);
        EXPECT_EQ(COMPLAINT([&] { SipPasswords::READ(file.getName()); }),
                  file.getName() + ": everybody may read or change it");
    }
}

TEST(SipPasswords, WhatIsNoFileIsRefused)
{
    EXPECT_EQ(COMPLAINT([] { SipPasswords::READ("/nowhere/at/all"); }), "/nowhere/at/all: cannot be read");
    EXPECT_EQ(COMPLAINT([] { SipPasswords::READ("/tmp"); }), "/tmp: is no file");
}
