// SPDX-License-Identifier: Apache-2.0
#include "TNamedList.h"
#include "tests/Support.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

struct TNamed {
  std::string fName;
  int fValue;
  std::string const& Name() const { return fName; }
};

using TList = TNamedList<TNamed>;

boost::shared_ptr<TNamed> Named(std::string const& name, int value) { return boost::make_shared<TNamed>(TNamed{name, value}); }

std::vector<int> ValuesOf(TList const& list) {
  std::vector<int> values;
  for (auto const& element : list.Elements()) values.push_back(element->fValue);
  return values;
}

TEST(TNamedListTest, ElementsComeInTheOrderOfAdditionAndAreFoundByNameInAnyCase) {
  TList list;
  list.Add(Named("beta", 2));
  list.Add(Named("Alpha", 1));

  EXPECT_EQ(ValuesOf(list), std::vector<int>({2, 1}));
  EXPECT_EQ(list.Find("BETA")->fValue, 2);
  EXPECT_EQ(list.PositionOf("alpha"), 1u);
  EXPECT_TRUE(list.Has("ALPHA"));
  EXPECT_FALSE(list.Has("gamma"));
  EXPECT_EQ(list.PositionOf("gamma"), TList::kNone);
  EXPECT_FALSE(list.Find("gamma"));
}

TEST(TNamedListTest, PutReplacesInPlaceOrAppends) {
  TList list;
  list.Put(Named("a", 1));
  list.Put(Named("b", 2));
  list.Put(Named("A", 3));
  EXPECT_EQ(ValuesOf(list), std::vector<int>({3, 2}));
  EXPECT_EQ(list.Find("a")->fValue, 3);
}

TEST(TNamedListTest, EveryElementOfALongListIsFoundAndCanBeReplaced) {
  TList list;
  for (int i = 0; i < 1000; ++i) {
    list.Add(Named("Name" + std::to_string(i), i));
    ASSERT_EQ(list.PositionOf("name" + std::to_string(i)), static_cast<std::size_t>(i));
    ASSERT_FALSE(list.Has("name" + std::to_string(i + 1)));
  }
  list.Put(Named("NAME500", -1));
  for (int i = 0; i < 1000; ++i) ASSERT_EQ(list.Find("NAME" + std::to_string(i))->fValue, i == 500 ? -1 : i);
  TList const copy = list;
  list.Clear();
  EXPECT_FALSE(list.Has("name7"));
  EXPECT_EQ(copy.PositionOf("name7"), 7u);
}

TEST(TNamedListTest, ClearedListFindsNothing) {
  TList list;
  list.Add(Named("a", 1));
  list.Clear();
  EXPECT_TRUE(list.Elements().empty());
  EXPECT_FALSE(list.Has("a"));
}

TEST(TNamedListTest, VisitStopsAtTheFirstFalseAndReturnsFalse) {
  TList list;
  for (int i = 0; i < 4; ++i) list.Add(Named(std::to_string(i), i));
  std::vector<int> visited;
  EXPECT_FALSE(VisitEach(list.Elements(), [&](boost::shared_ptr<TNamed> const& element) {
    visited.push_back(element->fValue);
    return element->fValue < 2;
  }));
  EXPECT_EQ(visited, std::vector<int>({0, 1, 2}));
  EXPECT_TRUE(VisitEach(list.Elements(), [](boost::shared_ptr<TNamed> const&) { return true; }));
}

TEST(TNamedListTest, TheListMayChangeDuringAVisit) {
  TList list;
  for (int i = 0; i < 3; ++i) list.Add(Named(std::to_string(i), i));
  std::vector<int> visited;
  EXPECT_TRUE(VisitEach(list.Elements(), [&](boost::shared_ptr<TNamed> const& element) {
    if (element->fValue == 1) list.Clear();
    visited.push_back(element->fValue);
    return true;
  }));
  EXPECT_EQ(visited, std::vector<int>({0, 1}));
}

}  // namespace
}  // namespace NQRVZEP20
