#include "tavik/base/containers.h"

#include <memory>
#include <string>
#include <string_view>
#include <type_traits>

#include "absl/hash/hash.h"
#include "gmock/gmock.h"
#include "gtest/gtest.h"

namespace tavik {
namespace {

using ::testing::Pair;
using ::testing::UnorderedElementsAre;

TEST(FlatHashMapTest, StringKeyedMapIsSearchedByStringView) {
  FlatHashMap<std::string, int> map;
  map["GtnrTuning"] = 9;
  map["LscTuning"] = 12;

  const std::string_view name = "GtnrTuning";
  const auto found = map.find(name);
  ASSERT_NE(found, map.end());
  EXPECT_EQ(found->first, "GtnrTuning");
  EXPECT_EQ(found->second, 9);
  EXPECT_TRUE(map.contains(std::string_view("LscTuning")));
  EXPECT_EQ(map.count(std::string_view("LscTuning")), 1u);
  EXPECT_FALSE(map.contains(std::string_view("BlcTuning")));
  EXPECT_EQ(map.find(std::string_view("BlcTuning")), map.end());
}

TEST(FlatHashMapTest, StringViewSearchComparesTheWholeView) {
  FlatHashMap<std::string, int> map;
  map["LscTuning"] = 12;
  map["LscStatsTuning"] = 11;

  // A view into a longer text sees only its own characters.
  const std::string text = "LscTuningBlock";
  EXPECT_TRUE(map.contains(std::string_view(text).substr(0, 9)));
  EXPECT_EQ(map.find(std::string_view(text).substr(0, 9))->second, 12);
  EXPECT_FALSE(map.contains(std::string_view(text).substr(0, 8)));
  EXPECT_FALSE(map.contains(std::string_view(text)));
}

TEST(FlatHashMapTest, StringKeysWithEmbeddedNulsAreDistinct) {
  FlatHashMap<std::string, int> map;
  map[std::string("a\0b", 3)] = 1;
  map[std::string("a")] = 2;
  EXPECT_EQ(map.size(), 2u);
  EXPECT_EQ(map.find(std::string_view("a\0b", 3))->second, 1);
  EXPECT_EQ(map.find(std::string_view("a"))->second, 2);
  EXPECT_FALSE(map.contains(std::string_view("a\0c", 3)));
}

TEST(FlatHashMapTest, EmptyStringIsAKey) {
  FlatHashMap<std::string, int> map;
  EXPECT_FALSE(map.contains(std::string_view()));
  map[""] = 7;
  EXPECT_TRUE(map.contains(std::string_view()));
  EXPECT_EQ(map.find(std::string_view(""))->second, 7);
}

TEST(FlatHashMapTest, StringKeyedMapIsSearchedByStdStringAndLiteral) {
  FlatHashMap<std::string, int> map;
  map.emplace("BlcTuning", 0);
  EXPECT_TRUE(map.contains(std::string("BlcTuning")));
  EXPECT_TRUE(map.contains("BlcTuning"));
  EXPECT_FALSE(map.contains("blctuning"));
}

TEST(FlatHashMapTest, EmplaceOfAPresentKeyKeepsTheFirstValue) {
  FlatHashMap<std::string, int> map;
  EXPECT_TRUE(map.try_emplace("BlcTuning", 1).second);
  EXPECT_FALSE(map.try_emplace("BlcTuning", 2).second);
  EXPECT_THAT(map, UnorderedElementsAre(Pair("BlcTuning", 1)));
}

TEST(FlatHashMapTest, HoldsMoveOnlyValues) {
  FlatHashMap<std::string, std::unique_ptr<int>> map;
  map.emplace("a", std::make_unique<int>(3));
  ASSERT_TRUE(map.contains(std::string_view("a")));
  EXPECT_EQ(*map.find(std::string_view("a"))->second, 3);
}

TEST(FlatHashMapTest, StringViewKeyedMapIsSearchedByString) {
  FlatHashMap<std::string_view, int> map;
  map.emplace("WbTuning", 24);
  EXPECT_TRUE(map.contains(std::string("WbTuning")));
  EXPECT_EQ(map.find(std::string("WbTuning"))->second, 24);
}

TEST(FlatHashMapTest, NonStringKeysUseAbslHash) {
  EXPECT_TRUE((std::is_same_v<FlatHashMap<int, int>::hasher, absl::Hash<int>>));
  EXPECT_TRUE((std::is_same_v<FlatHashMap<int, int>::key_equal, std::equal_to<int>>));
  FlatHashMap<int, std::string> map;
  map[3] = "three";
  map[-3] = "minus three";
  EXPECT_THAT(map, UnorderedElementsAre(Pair(3, "three"), Pair(-3, "minus three")));
}

TEST(FlatHashMapTest, StringKeysUseTheTransparentHashAndEquality) {
  EXPECT_TRUE((std::is_same_v<FlatHashMap<std::string, int>::hasher, StringHash>));
  EXPECT_TRUE((std::is_same_v<FlatHashMap<std::string, int>::key_equal, StringEq>));
  EXPECT_TRUE((std::is_same_v<FlatHashSet<std::string>::hasher, StringHash>));
  EXPECT_TRUE((std::is_same_v<FlatHashSet<std::string>::key_equal, StringEq>));
}

TEST(StringHashTest, HashesStringAndViewOfTheSameTextAlike) {
  const StringHash hash;
  const std::string text = "RgbYuvConversionTuning";
  EXPECT_EQ(hash(text), hash(std::string_view(text)));
  EXPECT_EQ(hash(text), hash("RgbYuvConversionTuning"));
}

TEST(StringEqTest, ComparesStringAndViewByCharacters) {
  const StringEq eq;
  EXPECT_TRUE(eq(std::string("abc"), std::string_view("abc")));
  EXPECT_FALSE(eq(std::string("abc"), std::string_view("abcd")));
  EXPECT_FALSE(eq(std::string("abc"), std::string_view("ABC")));
}

TEST(FlatHashSetTest, StringSetIsSearchedByStringView) {
  FlatHashSet<std::string> set = {"BlcTuning", "DpcTuning"};
  EXPECT_TRUE(set.contains(std::string_view("BlcTuning")));
  EXPECT_TRUE(set.contains(std::string_view("DpcTuning")));
  EXPECT_FALSE(set.contains(std::string_view("Blc")));
  EXPECT_EQ(set.find(std::string_view("DpcTuning")), set.find(std::string("DpcTuning")));
}

TEST(FlatHashSetTest, KeepsOneCopyOfEachKey) {
  FlatHashSet<std::string> set;
  EXPECT_TRUE(set.insert("a").second);
  EXPECT_FALSE(set.insert(std::string("a")).second);
  EXPECT_TRUE(set.insert("b").second);
  EXPECT_THAT(set, UnorderedElementsAre("a", "b"));
}

TEST(FlatHashSetTest, NonStringKeysUseAbslHash) {
  EXPECT_TRUE((std::is_same_v<FlatHashSet<int>::hasher, absl::Hash<int>>));
  FlatHashSet<int> set = {1, 2, 2, 3};
  EXPECT_THAT(set, UnorderedElementsAre(1, 2, 3));
}

TEST(HashTest, IsAbslHash) {
  EXPECT_TRUE((std::is_same_v<Hash<int>, absl::Hash<int>>));
  EXPECT_TRUE((std::is_same_v<Hash<std::string>, absl::Hash<std::string>>));
}

}  // namespace
}  // namespace tavik
