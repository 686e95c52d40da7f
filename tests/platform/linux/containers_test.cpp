// String lists and hashes.
#include <gmock/gmock.h>
#include <tavicore/szhash.h>
#include <tavicore/szlist.h>

#include <string>

TEST(SzList, KeepsCopiesInOrderHoweverLongItGrows) {
    VEXACSzList* list = VEXACSzListAlloc(16);
    for (int i = 0; i < 5000; ++i) {
        ASSERT_EQ(VEXACSzListPush(&list, std::to_string(i).c_str()), i);
    }
    EXPECT_EQ(VEXACSzListPush(&list, VEXACSzListGet(list, 0)), 5000);
    EXPECT_EQ(VEXACSzListPush(&list, nullptr), -1);
    EXPECT_EQ(list->count, 5001);
    EXPECT_STREQ(VEXACSzListGet(list, 4999), "4999");
    EXPECT_STREQ(VEXACSzListGet(list, 5000), "0");
    EXPECT_EQ(VEXACSzListGet(list, -1), nullptr);
    EXPECT_EQ(VEXACSzListGet(list, 5001), nullptr);
    VEXACSzListFree(list);
}

TEST(SzHash, ReplacesValuesOfKeysThatDifferInCaseOnly) {
    VEXACSzHash* hash = VEXACSzHashAlloc(0);
    for (const char* key : {"B", "a", "", "b", "B"}) {
        ASSERT_EQ(VEXACSzHashSetValue(&hash, key, (std::string(key) + "!").c_str()), 0);
    }
    EXPECT_EQ(VEXACSzHashSetValue(&hash, "a", VEXACSzHashGetValue(hash, "B")), 0);
    EXPECT_EQ(VEXACSzHashSetValue(&hash, "a", nullptr), -1);
    EXPECT_STREQ(VEXACSzHashGetValue(hash, "a"), "B!");
    EXPECT_STREQ(VEXACSzHashGetValue(hash, "b"), "b!");
    EXPECT_EQ(VEXACSzHashGetValue(hash, "A"), nullptr);
    VEXACSzHashFree(hash);
}
