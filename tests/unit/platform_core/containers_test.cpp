// SPDX-FileCopyrightText: The mediidx developers
// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <tavocore.h>

#include <memory>
#include <string>
#include <vector>

namespace {

using testing::ElementsAre;
using testing::IsEmpty;

using List = std::unique_ptr<TLIBSZLIST, decltype(&TLIBCSzListFree)>;
using Hash = std::unique_ptr<TLIBSZHASH, decltype(&TLIBCSzHashFree)>;

List make_list(int hint = 0) { return {TLIBCSzListAlloc(hint), TLIBCSzListFree}; }
Hash make_hash(int hint = 0) { return {TLIBCSzHashAlloc(hint), TLIBCSzHashFree}; }

TEST(AList, KeepsCopiesInOrder) {
  const auto list = make_list(0x14000);
  std::string text = "first";
  EXPECT_EQ(TLIBCSzListPush(list.get(), text.c_str()), 0);
  text = "other";
  EXPECT_EQ(TLIBCSzListPush(list.get(), ""), 0);
  EXPECT_EQ(TLIBCSzListCount(list.get()), 2);
  EXPECT_STREQ(TLIBCSzListGet(list.get(), 0), "first");
  EXPECT_STREQ(TLIBCSzListGet(list.get(), 1), "");
}

TEST(AList, HasNothingBeyondItsEnds) {
  const auto list = make_list();
  TLIBCSzListPush(list.get(), "only");
  EXPECT_EQ(TLIBCSzListGet(list.get(), -1), nullptr);
  EXPECT_EQ(TLIBCSzListGet(list.get(), 1), nullptr);
}

TEST(AList, LeavesItsTextsInPlaceWhenItGrows) {
  const auto list = make_list(-1);
  TLIBCSzListPush(list.get(), "short");
  const char* first = TLIBCSzListGet(list.get(), 0);
  for (int i = 0; i < 100000; ++i) TLIBCSzListPush(list.get(), "more");
  EXPECT_EQ(TLIBCSzListGet(list.get(), 0), first);
  EXPECT_STREQ(first, "short");
  EXPECT_EQ(TLIBCSzListCount(list.get()), 100001);
}

TEST(AList, ToleratesNulls) {
  const auto list = make_list();
  EXPECT_EQ(TLIBCSzListPush(nullptr, "a"), -1);
  EXPECT_EQ(TLIBCSzListPush(list.get(), nullptr), -1);
  EXPECT_EQ(TLIBCSzListCount(nullptr), 0);
  EXPECT_EQ(TLIBCSzListGet(nullptr, 0), nullptr);
  TLIBCSzListFree(nullptr);
}

std::vector<std::string> entries(const TLIBSZHASH* hash) {
  std::vector<std::string> found;
  int cursor = 0;
  const char* key = nullptr;
  const char* value = nullptr;
  while (TLIBCSzHashNext(hash, &cursor, &key, &value) == 1) {
    found.push_back(std::string(key) + "=" + value);
  }
  return found;
}

TEST(AHash, FindsValuesByKey) {
  const auto hash = make_hash(8192);
  std::string value = "5";
  EXPECT_EQ(TLIBCSzHashSetValue(hash.get(), "1000", value.c_str()), 0);
  value = "other";
  EXPECT_STREQ(TLIBCSzHashGetValue(hash.get(), "1000"), "5");
  EXPECT_EQ(TLIBCSzHashGetValue(hash.get(), "100"), nullptr);
}

TEST(AHash, IsVisitedInTheOrderOfFirstInsertion) {
  const auto hash = make_hash();
  TLIBCSzHashSetValue(hash.get(), "z", "1");
  TLIBCSzHashSetValue(hash.get(), "a", "2");
  TLIBCSzHashSetValue(hash.get(), "z", "3");
  EXPECT_THAT(entries(hash.get()), ElementsAre("z=3", "a=2"));
  EXPECT_EQ(TLIBCSzHashCount(hash.get()), 2);
}

TEST(AHash, FindsEveryKeyAfterGrowing) {
  const auto hash = make_hash(1);
  for (int i = 0; i < 50000; ++i) {
    const auto text = std::to_string(i);
    TLIBCSzHashSetValue(hash.get(), text.c_str(), ("v" + text).c_str());
  }
  int missing = 0;
  for (int i = 0; i < 50000; ++i) {
    const auto text = std::to_string(i);
    const char* value = TLIBCSzHashGetValue(hash.get(), text.c_str());
    missing += !value || "v" + text != value;
  }
  EXPECT_EQ(missing, 0);
}

TEST(AHash, TakesAbsurdHints) {
  EXPECT_NE(make_hash(-5), nullptr);
  EXPECT_NE(make_hash(2147483647), nullptr);
}

TEST(AHash, ToleratesNulls) {
  const auto hash = make_hash();
  EXPECT_EQ(TLIBCSzHashSetValue(nullptr, "a", "b"), -1);
  EXPECT_EQ(TLIBCSzHashSetValue(hash.get(), nullptr, "b"), -1);
  EXPECT_EQ(TLIBCSzHashSetValue(hash.get(), "a", nullptr), -1);
  EXPECT_EQ(TLIBCSzHashGetValue(nullptr, "a"), nullptr);
  EXPECT_EQ(TLIBCSzHashGetValue(hash.get(), nullptr), nullptr);
  EXPECT_EQ(TLIBCSzHashCount(nullptr), 0);
  EXPECT_THAT(entries(nullptr), IsEmpty());
  EXPECT_EQ(TLIBCSzHashNext(hash.get(), nullptr, nullptr, nullptr), 0);
  TLIBCSzHashFree(nullptr);
}

TEST(AHash, HasNothingAtACursorThatIsOutOfRange) {
  const auto hash = make_hash();
  TLIBCSzHashSetValue(hash.get(), "a", "b");
  for (int cursor : {-1, 1, 2147483647}) {
    const int before = cursor;
    EXPECT_EQ(TLIBCSzHashNext(hash.get(), &cursor, nullptr, nullptr), 0);
    EXPECT_EQ(cursor, before);
  }
}

}  // namespace
