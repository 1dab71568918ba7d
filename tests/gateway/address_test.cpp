#include <gtest/gtest.h>

#include <cstring>

#include "gateway/ProviderUtil.h"

using namespace CPTA;

namespace {

std::string colon(const char* s) { return ProviderUtil::getIndexInColonFormat(s).c_str(); }

TEST(AddressForms, ColonFormat) {
    EXPECT_EQ(colon("1000000533a0b1c2"), "10:00:00:05:33:a0:b1:c2");
    EXPECT_EQ(colon("0123456789ab"), "01:23:45:67:89:ab");
    EXPECT_EQ(colon("12345"), "12:345");  // an odd last character stays with the last pair
    EXPECT_EQ(colon("123"), "123");
    EXPECT_EQ(colon("01:02"), "01:02");
    EXPECT_STREQ(ProviderUtil::eraseColonsFromIndex("10:00:00:05:33:a0:b1:c2").c_str(),
                 "1000000533a0b1c2");
}

TEST(AddressForms, RawBytes) {
    unsigned char wwn[9];
    wwn[8] = 0x5A;
    ASSERT_TRUE(ProviderUtil::getRawWWNFromStr("1000000533A0b1c2", wwn));
    const unsigned char expected[8] = {0x10, 0x00, 0x00, 0x05, 0x33, 0xa0, 0xb1, 0xc2};
    EXPECT_EQ(std::memcmp(wwn, expected, 8), 0);
    EXPECT_EQ(wwn[8], 0x5A);  // exactly eight bytes written

    unsigned char mac[6];
    EXPECT_TRUE(ProviderUtil::getRawMacFromStr("0005331aBbCc", mac));
    EXPECT_EQ(mac[5], 0xcc);
    EXPECT_FALSE(ProviderUtil::getRawMacFromStr("0005331a", mac));
    EXPECT_FALSE(ProviderUtil::getRawMacFromStr("00:05:33:1a:bb:cc", mac));
    EXPECT_FALSE(ProviderUtil::getRawMacFromStr(nullptr, mac));
}

TEST(AddressForms, NodeAddressFromTag) {
    // Characters 19..22 hold the node part, 24 on the rest.
    EXPECT_STREQ(ProviderUtil::getNodeMACOrWWNFromTag("Adapter-00001-Port-0000:1000000533a0").c_str(),
                 "1000000533a0");
    EXPECT_STREQ(ProviderUtil::getNodeMACOrWWNFromTag("Adapter-00001-Port-ABCD:12").c_str(), "ABCD12");
    EXPECT_STREQ(ProviderUtil::getNodeMACOrWWNFromTag("short").c_str(), "");
}

TEST(ClassNames, TableAndBounds) {
    EXPECT_STREQ(ProviderUtil::getClassName(CID_NONE).c_str(), "--");
    EXPECT_STREQ(ProviderUtil::getClassName(CID_FC_PORT).c_str(), "TAVRIN_FCPort");
    EXPECT_STREQ(ProviderUtil::getClassName(CID_LOGICAL_DISK).c_str(), "TAVRIN_LogicalDisk");
    EXPECT_STREQ(ProviderUtil::getClassName(classId_t(39)).c_str(), "INVALID CLASS");
    EXPECT_STREQ(ProviderUtil::getClassName(classId_t(-1)).c_str(), "INVALID CLASS");
}

}  // namespace
