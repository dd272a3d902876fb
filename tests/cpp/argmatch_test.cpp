// The matcher and the option name list, driven through the factory as a matched method drives them.
#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "ArgMatch/ICmdArgMatcher.h"
#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "harness.h"

namespace {

using CommonI::RefCountPtr;
using Names = std::vector<std::string>;

const harness::OpenFirst* const g_opened =
    harness::OpenFirst::Add("libArgMatchKit", {CmdArgMatcherID, OptionNameListID});

template <class T>
RefCountPtr<T> Create(const Port::XUID& classId) {
    return RefCountPtr<T>(CitP::Factory::CreateInstanceRef(classId));
}

RefCountPtr<IOptionNameList> ListOf(const Names& names) {
    auto list = Create<IOptionNameList>(OptionNameListID);
    for (const auto& n : names) EXPECT_EQ(list->Add(n.c_str()), 1);
    return list;
}

RefCountPtr<IOptionNameIterator> IteratorOf(IOptionNameList& list) {
    RefCountPtr<IOptionNameIterator> it;
    EXPECT_EQ(list.GetIterator(it), 1);
    return it;
}

Names Walk(IOptionNameIterator& it) {
    Names out;
    for (it.First(); !it.IsDone(); it.Next()) out.emplace_back(it.Current().c_str());
    return out;
}

class ArgMatch : public ::testing::Test {
protected:
    static void SetUpTestSuite() { ASSERT_TRUE(CitP::Factory::LoadLibraryFactory("libArgMatchKit")); }
    // Match with candidates read from `candidates`; gives the names now in `matches`.
    Names Match(const char* typed, IOptionNameList& candidates, RefCountPtr<IOptionNameList>& matches) {
        RefCountPtr<IOptionNameSource> source(IteratorOf(candidates));
        EXPECT_EQ(matcher->Match(typed, source, matches), 1);
        return matches ? Walk(*IteratorOf(*matches)) : Names{"<null>"};
    }
    RefCountPtr<ICmdArgMatcher> matcher = Create<ICmdArgMatcher>(CmdArgMatcherID);
};

TEST(ArgMatchLoad, OpeningTheLibraryRegistersItsClasses) { g_opened->ExpectOpeningRegistered(); }

TEST_F(ArgMatch, ExactNameWinsElsePrefixes) {
    const struct {
        const char* typed;
        Names candidates, expected;
    } cases[] = {
        {"exp", {"exactmatch", "exp"}, {"exp"}},
        {"exp", {"exp", "expand", "expert"}, {"exp"}},
        {"uni", {"order_dependent", "unique"}, {"unique"}},
        {"e", {"exactmatch", "exp", "regexp"}, {"exactmatch", "exp"}},
        {"x", {"exactmatch", "exp"}, {}},
        {"expx", {"exp"}, {}},
        {"Exp", {"exp"}, {}},
        {"", {"color", "name"}, {"color", "name"}},
        {"c", {"color", "color"}, {"color", "color"}},
    };
    auto matches = ListOf({"stale"});  // one list through all cases: each call starts it afresh
    for (const auto& c : cases) {
        EXPECT_EQ(Match(c.typed, *ListOf(c.candidates), matches), c.expected) << "typed '" << c.typed << "'";
        EXPECT_EQ(matches->Size(), static_cast<int32_t>(c.expected.size()));
    }
}

TEST_F(ArgMatch, EdgesOfTheCall) {
    RefCountPtr<IOptionNameList> matches;
    EXPECT_EQ(Match("in", *ListOf({"in", "index"}), matches), Names{"in"}) << "a null list is made anew";
    auto self = ListOf({"in", "index", "type"});
    EXPECT_EQ(Match("i", *self, self), (Names{"in", "index"})) << "candidates from the list being filled";
    RefCountPtr<IOptionNameSource> none;
    EXPECT_EQ(matcher->Match("in", none, matches), 0);
    EXPECT_EQ(matches->Size(), 1) << "a refused call leaves the matches alone";
}

TEST_F(ArgMatch, ListAndIterator) {
    const std::string longName(300, 'n');  // beyond any inline room of the string
    auto list = ListOf({"zeta", "alpha", "zeta", longName});
    EXPECT_EQ(list->Size(), 4);
    auto it = IteratorOf(*list);
    EXPECT_EQ(Walk(*it), (Names{"zeta", "alpha", "zeta", longName}));
    list->Clear();
    list->Add("b");
    EXPECT_EQ(Walk(*IteratorOf(*list)), Names{"b"});
    list = nullptr;
    // Stores of ended lists are reused by new lists; the one the iterator holds is not among them.
    for (const char* name : {"p", "q", "r"}) ListOf({name, name});
    EXPECT_EQ(Walk(*it), (Names{"zeta", "alpha", "zeta", longName})) << "walks the names it was made over";
    EXPECT_STREQ(it->Current().c_str(), "");
    auto* source = static_cast<IOptionNameSource*>(it->GetInterface(IOptionNameSourceID));
    ASSERT_NE(source, nullptr);
    EXPECT_EQ(source->GetInterface(IOptionNameIteratorID), it.get());
    EXPECT_NE(source->GetInterface(CommonI::IRefCountID), nullptr);
    EXPECT_EQ(matcher->GetInterface(IOptionNameListID), nullptr);
}

TEST_F(ArgMatch, InstancesEndWithTheirLastReference) {
    {
        auto valid = ListOf({"exactmatch", "exp"});
        RefCountPtr<IOptionNameList> matches;
        Match("e", *valid, matches);
        auto it = IteratorOf(*matches);
        EXPECT_EQ(CitP::InstanceTable::Live(CmdArgMatcherID), 1);
        EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), 2);
        matches = nullptr;
        EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), 1) << "an iterator holds no list";
    }
    matcher = nullptr;
    EXPECT_EQ(CitP::InstanceTable::Live(CmdArgMatcherID), 0);
    EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), 0);
}

}  // namespace
