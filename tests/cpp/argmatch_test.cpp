// The matcher and the option name list, driven through the factory as a matched method drives them.
#include <dlfcn.h>
#include <gtest/gtest.h>
#include <unistd.h>

#include <climits>
#include <cstdlib>
#include <string>
#include <vector>

#include "ArgMatch/ICmdArgMatcher.h"
#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"

namespace {

using Names = std::vector<std::string>;
using CommonI::RefCountPtr;

// Registration state seen around the first load, before any test could call the factory's loader.
struct LoadProbe {
    bool knownBefore = true;
    bool knownAfterOpen = false;
    std::string openError;
};
LoadProbe g_probe;

std::string LibraryDir() {
    if (const char* dir = std::getenv("KELMAR_LIB")) return dir;
    char exe[PATH_MAX] = {};
    const ssize_t n = readlink("/proc/self/exe", exe, sizeof exe - 1);
    std::string path(exe, n > 0 ? n : 0);
    return path.substr(0, path.rfind('/')) + "/../lib";
}

class OpenWithoutFactory : public ::testing::Environment {
public:
    void SetUp() override {
        g_probe.knownBefore = CitP::Factory::IsRegistered(CmdArgMatcherID);
        const std::string path = LibraryDir() + "/libArgMatchKit.so";
        if (!dlopen(path.c_str(), RTLD_NOW | RTLD_GLOBAL)) g_probe.openError = dlerror();
        g_probe.knownAfterOpen =
            CitP::Factory::IsRegistered(CmdArgMatcherID) && CitP::Factory::IsRegistered(OptionNameListID);
    }
};
const auto* g_env = ::testing::AddGlobalTestEnvironment(new OpenWithoutFactory);

template <class T>
RefCountPtr<T> Create(const Port::XUID& classId) {
    return RefCountPtr<T>(CitP::Factory::CreateInstanceRef(classId));
}

RefCountPtr<IOptionNameList> ListOf(const Names& names) {
    auto list = Create<IOptionNameList>(OptionNameListID);
    for (const auto& n : names) EXPECT_EQ(list->Add(n.c_str()), 1);
    return list;
}

Names Walk(IOptionNameIterator& it) {
    Names out;
    for (it.First(); !it.IsDone(); it.Next()) out.emplace_back(it.Current().c_str());
    return out;
}

Names Read(IOptionNameList& list) {
    RefCountPtr<IOptionNameIterator> it;
    EXPECT_EQ(list.GetIterator(it), 1);
    return it ? Walk(*it) : Names{};
}

RefCountPtr<IOptionNameSource> SourceOf(IOptionNameList& list) {
    RefCountPtr<IOptionNameIterator> it;
    EXPECT_EQ(list.GetIterator(it), 1);
    return RefCountPtr<IOptionNameSource>(it);
}

class ArgMatch : public ::testing::Test {
protected:
    static void SetUpTestSuite() { ASSERT_TRUE(CitP::Factory::LoadLibraryFactory("libArgMatchKit")); }
    void SetUp() override {
        matcher = Create<ICmdArgMatcher>(CmdArgMatcherID);
        ASSERT_TRUE(matcher);
    }
    RefCountPtr<ICmdArgMatcher> matcher;
};

TEST(ArgMatchLoad, LoadingTheLibraryRegistersItsClasses) {
    EXPECT_FALSE(g_probe.knownBefore);
    EXPECT_EQ(g_probe.openError, "");
    EXPECT_TRUE(g_probe.knownAfterOpen);
}

struct MatchCase {
    const char* typed;
    Names candidates;
    Names expected;
};

TEST_F(ArgMatch, MatchesByPrefixAndPrefersTheExactName) {
    const MatchCase cases[] = {
        {"exp", {"exactmatch", "exp"}, {"exp"}},
        {"exp", {"exp", "expand", "expert"}, {"exp"}},
        {"uni", {"order_dependent", "unique"}, {"unique"}},
        {"e", {"exactmatch", "exp", "regexp"}, {"exactmatch", "exp"}},
        {"x", {"exactmatch", "exp"}, {}},
        {"expx", {"exp"}, {}},
        {"Exp", {"exp"}, {}},
        {"", {"color", "name"}, {"color", "name"}},
        {"a", {}, {}},
        {"c", {"color", "color"}, {"color", "color"}},
    };
    for (const auto& c : cases) {
        SCOPED_TRACE(std::string("typed '") + c.typed + "'");
        auto candidates = ListOf(c.candidates);
        auto source = SourceOf(*candidates);
        auto matches = Create<IOptionNameList>(OptionNameListID);
        ASSERT_EQ(matcher->Match(c.typed, source, matches), 1);
        EXPECT_EQ(Read(*matches), c.expected);
        EXPECT_EQ(matches->Size(), static_cast<int32_t>(c.expected.size()));
    }
}

TEST_F(ArgMatch, MatchesHoldOnlyTheLastCallsNames) {
    auto candidates = ListOf({"exactmatch", "exp", "type"});
    auto matches = ListOf({"stale"});
    auto source = SourceOf(*candidates);
    ASSERT_EQ(matcher->Match("e", source, matches), 1);
    EXPECT_EQ(Read(*matches), (Names{"exactmatch", "exp"}));
    source = SourceOf(*candidates);
    ASSERT_EQ(matcher->Match("t", source, matches), 1);
    EXPECT_EQ(Read(*matches), Names{"type"});
    source = SourceOf(*candidates);
    ASSERT_EQ(matcher->Match("q", source, matches), 1);
    EXPECT_EQ(matches->Size(), 0);
}

TEST_F(ArgMatch, EdgesOfTheCall) {
    auto candidates = ListOf({"in", "index"});
    RefCountPtr<IOptionNameList> matches;
    auto source = SourceOf(*candidates);
    ASSERT_EQ(matcher->Match("in", source, matches), 1) << "a null match list is made anew";
    ASSERT_TRUE(matches);
    EXPECT_EQ(Read(*matches), Names{"in"});

    // Candidates read from the very list that receives the matches.
    auto self = ListOf({"in", "index", "type"});
    source = SourceOf(*self);
    ASSERT_EQ(matcher->Match("i", source, self), 1);
    EXPECT_EQ(Read(*self), (Names{"in", "index"}));

    RefCountPtr<IOptionNameSource> none;
    EXPECT_EQ(matcher->Match("in", none, matches), 0);
    EXPECT_EQ(Read(*matches), Names{"in"}) << "a refused call leaves the matches alone";
}

TEST_F(ArgMatch, ListKeepsOrderAndDuplicates) {
    auto list = ListOf({"zeta", "alpha", "zeta"});
    EXPECT_EQ(list->Size(), 3);
    EXPECT_EQ(Read(*list), (Names{"zeta", "alpha", "zeta"}));
    EXPECT_EQ(list->Clear(), 1);
    EXPECT_EQ(list->Size(), 0);
    EXPECT_EQ(Read(*list), Names{});
    const std::string longName(300, 'n');  // beyond any inline room of the string
    list->Add(longName.c_str());
    EXPECT_EQ(Read(*list), Names{longName});
}

TEST_F(ArgMatch, IteratorWalksTheNamesAsTheyWereWhenMade) {
    auto list = ListOf({"a", "b"});
    RefCountPtr<IOptionNameIterator> it;
    ASSERT_EQ(list->GetIterator(it), 1);
    list->Add("c");
    EXPECT_EQ(Walk(*it), (Names{"a", "b"}));
    list->Clear();
    EXPECT_EQ(Walk(*it), (Names{"a", "b"})) << "First starts over";
    EXPECT_EQ(Read(*list), Names{});
    list = nullptr;
    EXPECT_EQ(Walk(*it), (Names{"a", "b"})) << "the names outlive the list";
    EXPECT_TRUE(it->IsDone());
    EXPECT_STREQ(it->Current().c_str(), "");
    it->Next();
    EXPECT_TRUE(it->IsDone());
}

TEST_F(ArgMatch, ComponentsAnswerTheirInterfaces) {
    auto list = ListOf({"x"});
    RefCountPtr<IOptionNameIterator> it;
    ASSERT_EQ(list->GetIterator(it), 1);
    struct Face {
        CitI::IInterface* object;
        Port::XUIDLiteral id;
        bool answers;
    };
    const Face faces[] = {
        {matcher.get(), ICmdArgMatcherID, true},  {matcher.get(), CitI::IInterfaceID, true},
        {matcher.get(), CommonI::IRefCountID, true}, {matcher.get(), IOptionNameListID, false},
        {list.get(), IOptionNameListID, true},    {list.get(), CommonI::IRefCountID, true},
        {list.get(), IOptionNameSourceID, false}, {it.get(), IOptionNameIteratorID, true},
        {it.get(), IOptionNameSourceID, true},    {it.get(), CitI::IInterfaceID, true},
        {it.get(), CommonI::IRefCountID, true},   {it.get(), ICmdArgMatcherID, false},
    };
    for (const auto& f : faces) {
        SCOPED_TRACE(Port::XUID(f.id).ToString().c_str());
        EXPECT_EQ(f.object->GetInterface(f.id) != nullptr, f.answers);
    }
    // Both faces of the iterator lead back to the same object.
    auto* source = static_cast<IOptionNameSource*>(it->GetInterface(IOptionNameSourceID));
    EXPECT_EQ(source->GetInterface(IOptionNameIteratorID), it.get());
}

TEST_F(ArgMatch, InstancesEndWithTheirLastReference) {
    const long matchers = CitP::InstanceTable::Live(CmdArgMatcherID);
    const long lists = CitP::InstanceTable::Live(OptionNameListID);
    {
        auto valid = ListOf({"exactmatch", "exp"});
        RefCountPtr<IOptionNameList> matches;
        auto source = SourceOf(*valid);
        auto second = Create<ICmdArgMatcher>(CmdArgMatcherID);
        ASSERT_EQ(second->Match("e", source, matches), 1);
        RefCountPtr<IOptionNameIterator> it;
        ASSERT_EQ(matches->GetIterator(it), 1);
        EXPECT_EQ(CitP::InstanceTable::Live(CmdArgMatcherID), matchers + 1);
        EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), lists + 2);
        valid = nullptr;
        EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), lists + 1) << "iterators hold no list";
    }
    EXPECT_EQ(CitP::InstanceTable::Live(CmdArgMatcherID), matchers);
    EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), lists);
    matcher = nullptr;
    EXPECT_EQ(CitP::InstanceTable::Live(CmdArgMatcherID), 0);
    EXPECT_EQ(CitP::InstanceTable::Live(OptionNameListID), 0);
}

}  // namespace
