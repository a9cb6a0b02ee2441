#include "TNamedList.h"
#include "tests/Support.h"

#include <boost/make_shared.hpp>

namespace NQRVZEP20 {
namespace {

using TList = TNamedList<int>;

std::vector<int> ValuesOf(TList const& list) {
  std::vector<int> values;
  for (auto const& element : list.Elements()) values.push_back(*element);
  return values;
}

TEST(TNamedListTest, ElementsComeInTheOrderOfAdditionAndAreFoundByNameInAnyCase) {
  TList list;
  list.Add("beta", boost::make_shared<int>(2));
  list.Add("Alpha", boost::make_shared<int>(1));

  EXPECT_EQ(ValuesOf(list), std::vector<int>({2, 1}));
  EXPECT_EQ(*list.Find("BETA"), 2);
  EXPECT_EQ(list.PositionOf("alpha"), 1u);
  EXPECT_TRUE(list.Has("ALPHA"));
  EXPECT_FALSE(list.Has("gamma"));
  EXPECT_EQ(list.PositionOf("gamma"), TList::kNone);
  EXPECT_FALSE(list.Find("gamma"));
}

TEST(TNamedListTest, PutReplacesInPlaceOrAppends) {
  TList list;
  list.Put("a", boost::make_shared<int>(1));
  list.Put("b", boost::make_shared<int>(2));
  list.Put("A", boost::make_shared<int>(3));
  EXPECT_EQ(ValuesOf(list), std::vector<int>({3, 2}));
  EXPECT_EQ(*list.Find("a"), 3);
}

TEST(TNamedListTest, ClearedListFindsNothing) {
  TList list;
  list.Add("a", boost::make_shared<int>(1));
  list.Clear();
  EXPECT_TRUE(list.Elements().empty());
  EXPECT_FALSE(list.Has("a"));
}

TEST(TNamedListTest, VisitStopsAtTheFirstFalseAndSaysSo) {
  TList list;
  for (int i = 0; i < 4; ++i) list.Add(std::to_string(i), boost::make_shared<int>(i));
  std::vector<int> visited;
  EXPECT_FALSE(VisitEach(list.Elements(), [&](boost::shared_ptr<int> const& element) {
    visited.push_back(*element);
    return *element < 2;
  }));
  EXPECT_EQ(visited, std::vector<int>({0, 1, 2}));
  EXPECT_TRUE(VisitEach(list.Elements(), [](boost::shared_ptr<int> const&) { return true; }));
}

TEST(TNamedListTest, VisitOutlivesAChangeOfTheList) {
  TList list;
  for (int i = 0; i < 3; ++i) list.Add(std::to_string(i), boost::make_shared<int>(i));
  std::vector<int> visited;
  EXPECT_TRUE(VisitEach(list.Elements(), [&](boost::shared_ptr<int> const& element) {
    if (*element == 1) list.Clear();
    visited.push_back(*element);
    return true;
  }));
  EXPECT_EQ(visited, std::vector<int>({0, 1}));
}

}  // namespace
}  // namespace NQRVZEP20
