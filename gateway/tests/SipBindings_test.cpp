#include "sip/registrar/SipBindings.h"

#include "sip/registrar/SipBindingStore.h"
#include "testing/DrivenClock.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <sys/stat.h>
#include <unistd.h>

namespace
{
class SipBindingsTest : public testing::Test
{
protected:
    SipBindings::Result set(std::string const& uri, unsigned int seconds, std::string const& callId = "1",
                            unsigned int preference = 1000)
    {
        return bindings.update("alice", {{uri, preference, seconds}}, callId, ++sequence);
    }
    std::string found(std::string_view user = "alice") const
    {
        std::string text;
        for (SipBinding const& binding : bindings.find(user))
            text += binding.uri + " ";
        return text;
    }

    DrivenClock clock;
    SipBindings bindings{3};
    std::uint32_t sequence = 0;
};

/// A folder of its own, gone at the end.
class Folder
{
public:
    Folder() { EXPECT_NE(mkdtemp(m_name.data()), nullptr); }
    ~Folder()
    {
        for (char const* const end : {"", "-wal", "-shm"})
            unlink((getFile() + end).c_str());
        rmdir(m_name.c_str());
    }
    Folder(Folder const&) = delete;
    Folder& operator=(Folder const&) = delete;
    std::string getFile() const { return m_name + "/contacts"; }

private:
    std::string m_name = "/tmp/contacts.XXXXXX";
};

void KEEP_NOTHING(std::string const&, SipBinding const&) {}
} // namespace

TEST_F(SipBindingsTest, TheBestLikedComesFirstThenTheLatest)
{
    set("a", 60);
    set("b", 60);
    set("c", 60, "1", 500);
    EXPECT_EQ(found(), "b a c ");
    set("a", 60);
    EXPECT_EQ(found(), "a b c ");
    EXPECT_EQ(found("bob"), "");
    EXPECT_EQ(bindings.getNumber(), 3u);
}

TEST_F(SipBindingsTest, ItExpiresAndIsTakenBack)
{
    set("a", 60);
    set("b", 120);
    clock.advance(60000);
    EXPECT_EQ(found(), "b ");
    set("b", 0);
    EXPECT_EQ(found(), "");
    EXPECT_EQ(set("x", 0), SipBindings::OK); // which was not there
    EXPECT_EQ(bindings.getNumber(), 0u);
}

TEST_F(SipBindingsTest, NobodyHasMoreThanSoMany)
{
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 60}, {"b", 1000, 60}}, "1", 1), SipBindings::OK);
    EXPECT_EQ(bindings.update("alice", {{"c", 1000, 60}, {"d", 1000, 60}}, "1", 2), SipBindings::TOO_MANY);
    EXPECT_EQ(found(), "b a "); // neither of them
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 0}, {"c", 1000, 60}, {"d", 1000, 60}}, "1", 3), SipBindings::OK);
    EXPECT_EQ(bindings.update("bob", {{"d", 1000, 60}}, "1", 1), SipBindings::OK);
}

TEST_F(SipBindingsTest, WhatWasOvertakenChangesNothing)
{
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 60}}, "1", 7), SipBindings::OK);
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 0}}, "1", 7), SipBindings::OUT_OF_ORDER);
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 0}}, "1", 6), SipBindings::OUT_OF_ORDER);
    EXPECT_EQ(bindings.clear("alice", "1", 7), SipBindings::OUT_OF_ORDER);
    EXPECT_EQ(found(), "a ");
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 60}}, "2", 1),
              SipBindings::REFRESHED); // the phone was started anew
    EXPECT_EQ(bindings.clear("alice", "1", 8), SipBindings::OK);
    EXPECT_EQ(found(), "");
}

TEST_F(SipBindingsTest, WhoStaysWhereHeIsTellsNothingNew)
{
    EXPECT_EQ(set("a", 60), SipBindings::OK);
    EXPECT_EQ(set("a", 60), SipBindings::REFRESHED);
    EXPECT_EQ(set("a", 120, "2"), SipBindings::REFRESHED);
    EXPECT_EQ(set("b", 60), SipBindings::OK);
    EXPECT_EQ(set("b", 0), SipBindings::OK);
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 60, "elsewhere"}}, "1", ++sequence), SipBindings::OK);
    EXPECT_EQ(bindings.update("alice", {{"a", 1000, 60, "elsewhere", "<sip:edge;lr>"}}, "1", ++sequence),
              SipBindings::OK);
    EXPECT_EQ(bindings.update("alice", {}, "1", ++sequence), SipBindings::REFRESHED);
    clock.advance(61000);
    EXPECT_EQ(set("a", 60), SipBindings::OK); // it had expired
}

TEST_F(SipBindingsTest, AFileKeepsThem)
{
    Folder const folder;
    {
        SipBindingStore store(folder.getFile(), "a", KEEP_NOTHING);
        set("sip:one", 60, "1", 500);
        set("sip:two", 120);
        store.write("alice", {{"sip:gone", "1", 1, 1000, 5000}});
        store.write("alice", bindings.find("alice")); // in its place
        store.write("carol", {{"sip:c", "1", 1, 1000, SipBindings::NOW() + 60}}, true);
        store.write("o'bob;--", {{"sip:b", "2", 4294967295u, 0, SipBindings::NOW() + 60, "sip:nat", "<sip:edge;lr>"}});
        EXPECT_EQ(store.getNumberOfFailures(), 0u);
    }
    struct stat status = {};
    EXPECT_EQ(stat(folder.getFile().c_str(), &status), 0);
    EXPECT_EQ(status.st_mode & 0777, 0600u);

    SipBindings kept(3);
    SipBindingStore const again(folder.getFile(), "a",
                                [&](std::string const& user, SipBinding const& binding)
                                { kept.restore(user, binding); });
    ASSERT_EQ(kept.find("alice").size(), 2u);
    EXPECT_EQ(kept.find("alice")[0].uri, "sip:two");
    EXPECT_EQ(kept.find("alice")[1].preference, 500u);
    EXPECT_EQ(kept.find("o'bob;--").at(0).sequence, 4294967295u);
    EXPECT_EQ(kept.find("o'bob;--").at(0).called, "sip:nat");
    EXPECT_EQ(kept.find("carol").size(), 1u); // what waits is written at the end
    EXPECT_EQ(kept.find("o'bob;--").at(0).route, "<sip:edge;lr>");
    SipBindingStore const other(folder.getFile(), "b",
                                [](std::string const&, SipBinding const&) { ADD_FAILURE() << "another interface's"; });
}

TEST_F(SipBindingsTest, AFileThatIsNoneIsRefused)
{
    Folder const folder;
    std::ofstream(folder.getFile()) << std::string(4096, 'x');
    EXPECT_THROW(SipBindingStore(folder.getFile(), "a", KEEP_NOTHING), SipBindingStore::Failure);
    EXPECT_THROW(SipBindingStore("/nowhere/at/all", "a", KEEP_NOTHING), SipBindingStore::Failure);
}
