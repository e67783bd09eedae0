#include "sip/message/SipIsup.h"

#include "sip/message/SipBody.h"
#include "sip/message/SipContent.h"

#include <gtest/gtest.h>

#include <string>

namespace
{
constexpr char const* TYPE_OF_ISUP = "application/ISUP;version=itu-t92+;base=itu-t92+";
std::string const IAM("\x01\x00\x49\x00\n--part\r\xff", 13);

std::string MIXED(std::string const& disposition)
{
    return std::string("--x\r\nContent-Type: application/sdp\r\n\r\nv=0\r\n--x\r\nContent-Type: ") + TYPE_OF_ISUP +
           disposition + "\r\n\r\n" + IAM + "\r\n--x--\r\n";
}
SipBody READ_MIXED(std::string const& body, bool takesIsup)
{
    return SipBody::READ(body, "multipart/mixed;boundary=x", "", "", takesIsup);
}
} // namespace

TEST(SipIsup, CrossesAsATextWhateverItsOctets)
{
    SipIsup const crossed = SipIsup::OF_TEXT(SipIsup{TYPE_OF_ISUP, IAM}.getText());
    EXPECT_EQ(crossed.type, TYPE_OF_ISUP);
    EXPECT_EQ(crossed.body, IAM);
    for (char const* const text : {"", "x", "application/isup\n0", "application/isup\n0g", "application/isup\n 1"})
        EXPECT_TRUE(SipIsup::OF_TEXT(text).isEmpty()) << text;
}

TEST(SipIsup, IsOfATypeThatCanBeHandedOn)
{
    EXPECT_TRUE(SipIsup::IS_TYPE("application/isup"));
    EXPECT_TRUE(SipIsup::IS_TYPE(TYPE_OF_ISUP));
    EXPECT_FALSE(SipIsup::IS_TYPE("application/qsig"));
    EXPECT_FALSE(SipIsup::IS_TYPE("application/isup;version=\r\nX: y"));
    EXPECT_FALSE(SipIsup::IS_TYPE("application/isup;version=" + std::string(200, 'x')));
}

TEST(SipIsup, IsReadBesideTheSessionWhereItIsAskedFor)
{
    SipBody const read = READ_MIXED(MIXED(""), true);
    EXPECT_TRUE(read.isUnderstood());
    EXPECT_EQ(read.session, "v=0");
    EXPECT_EQ(read.isup.type, TYPE_OF_ISUP);
    EXPECT_EQ(read.isup.body, IAM);
}

TEST(SipIsup, IsInTheWayElsewhereUnlessItIsOptional)
{
    EXPECT_FALSE(READ_MIXED(MIXED(""), false).isUnderstood());
    SipBody const read = READ_MIXED(MIXED("\r\nContent-Disposition: signal;handling=optional"), false);
    EXPECT_TRUE(read.isUnderstood());
    EXPECT_EQ(read.session, "v=0");
    EXPECT_TRUE(read.isup.isEmpty());
}

TEST(SipIsup, IsWrittenSoThatItCanBeReadAndPassedOver)
{
    SipContent const content = SipContent::OF("v=0", {}, {TYPE_OF_ISUP, IAM});
    EXPECT_EQ(content.getPayload().pl_len, content.body.size());
    for (bool const takesIsup : {true, false})
    {
        SipBody const read = SipBody::READ(content.body, content.type, "", "", takesIsup);
        EXPECT_TRUE(read.isUnderstood());
        EXPECT_EQ(read.session, "v=0");
        EXPECT_EQ(read.isup.body, takesIsup ? IAM : "");
    }
    SipContent const alone = SipContent::OF({}, {}, {TYPE_OF_ISUP, IAM});
    EXPECT_TRUE(SipBody::READ(alone.body, alone.type, "", "").isUnderstood());
    EXPECT_EQ(SipBody::READ(alone.body, alone.type, "", "", true).isup.body, IAM);
}
