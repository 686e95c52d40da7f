// String lists and hashes.
#include <gmock/gmock.h>
#include <tavicore/error.h>
#include <tavicore/szhash.h>
#include <tavicore/szlist.h>

#include <string>

namespace {

TEST(SzList, KeepsCopiesInOrderHoweverLongItGrows) {
    VEXACSzList* list = VEXACSzListAlloc(16);
    for (int i = 0; i < 5000; ++i) {
        ASSERT_EQ(VEXACSzListPush(&list, std::to_string(i).c_str()), i);
    }
    EXPECT_EQ(list->count, 5000);
    EXPECT_EQ(VEXACSzListPush(&list, VEXACSzListGet(list, 0)), 5000);
    EXPECT_STREQ(VEXACSzListGet(list, 4999), "4999");
    EXPECT_STREQ(VEXACSzListGet(list, 5000), "0");
    EXPECT_EQ(VEXACSzListGet(list, -1), nullptr);
    EXPECT_EQ(VEXACSzListGet(list, 5001), nullptr);
    VEXACSzListFree(list);
}

TEST(SzHash, ReplacesValuesAndKeepsTheOrderOfKeys) {
    VEXACSzHash* hash = VEXACSzHashAlloc(0);
    for (const char* key : {"B", "a", "", "b", "B"}) {
        ASSERT_EQ(VEXACSzHashSetValue(&hash, key, (std::string(key) + "!").c_str()), 0);
    }
    EXPECT_EQ(VEXACSzHashSetValue(&hash, "a", VEXACSzHashGetValue(hash, "B")), 0);
    EXPECT_STREQ(VEXACSzHashGetValue(hash, "a"), "B!");
    EXPECT_STREQ(VEXACSzHashGetValue(hash, ""), "!");
    EXPECT_EQ(VEXACSzHashGetValue(hash, "A"), nullptr);
    VEXACSzHashFree(hash);
}

TEST(Containers, RefuseWhatIsNoArgument) {
    VEXACSzList* list = VEXACSzListAlloc(1);
    VEXACSzHash* hash = VEXACSzHashAlloc(1);
    VEXACSzList* noList = nullptr;
    VEXACSzHash* noHash = nullptr;
    EXPECT_EQ(VEXACSzListPush(&noList, "x"), -1);
    EXPECT_EQ(VEXACSzListPush(&list, nullptr), -1);
    EXPECT_EQ(VEXACSzListGet(nullptr, 0), nullptr);
    EXPECT_EQ(VEXACSzHashSetValue(&noHash, "k", "v"), -1);
    EXPECT_EQ(VEXACSzHashSetValue(&hash, "k", nullptr), -1);
    EXPECT_EQ(VEXACSzHashGetValue(nullptr, "k"), nullptr);
    VEXACErrSet(VEXAC_ERR_NONE);
    EXPECT_EQ(VEXACSzListAlloc(-1), nullptr);
    EXPECT_EQ(VEXACErrGet(), VEXAC_ERR_BAD_PARAMETER);
    VEXACSzListFree(list);
    VEXACSzHashFree(hash);
    VEXACSzListFree(nullptr);
    VEXACSzHashFree(nullptr);
}

}  // namespace
