// The portability layer: strings, identifiers, messages, UT_STR, the component factory with its
// library cache, the instance table, the init objects and the recycling of component memory.
#include <gtest/gtest.h>

#include <cctype>
#include <cstring>
#include <functional>
#include <string>
#include <thread>
#include <vector>

#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "CommonI/RefCountPtr.h"
#include "Port/Init.h"
#include "Port/MsgData.h"
#include "Port/Recycle.h"
#include "Port/StringBase.h"
#include "Port/UT_STR.h"
#include "Port/XUID.h"
#include "fixtures/port_fixture.h"

namespace {

bool HoldsInline(const Port_String& s) {
    const char* object = reinterpret_cast<const char*>(&s);
    return std::less_equal<const char*>()(object, s.c_str()) &&
           std::less<const char*>()(s.c_str(), object + sizeof(s));
}

// Every byte within the string's length, embedded nuls included, and the nul behind them.
void ExpectWellFormed(const Port_String& s, const std::string& expected) {
    EXPECT_EQ(std::string(s.c_str(), static_cast<size_t>(s.Length())), expected);
    EXPECT_EQ(s.c_str()[s.Length()], '\0');
}

int Sign(int result) { return (result > 0) - (result < 0); }
std::string Shown(const char* text) { return text ? text : "(null)"; }

// ---------------------------------------------------------------------------------------------
// Port::StringBase<char>

TEST(StringBase, ConstructorsKeepEveryCountedByteAndTakeNullAsEmpty) {
    const Port_String empty, fromNull(static_cast<const char*>(nullptr));
    ExpectWellFormed(empty, "");
    ExpectWellFormed(fromNull, "");
    EXPECT_TRUE(empty.IsEmpty());
    EXPECT_TRUE(empty == fromNull);
    const char bytes[] = "ab\0cd";
    ExpectWellFormed(Port_String(bytes, 5), std::string(bytes, 5));
    EXPECT_FALSE(Port_String(bytes, 5) == "ab");
    ExpectWellFormed(Port_String("up to nul", -1), "up to nul");  // a negative length reads to the nul
    ExpectWellFormed(Port_String(nullptr, 4), "");
    for (const size_t length : {size_t{0}, size_t{27}, size_t{28}, size_t{4000}}) {
        SCOPED_TRACE(length);
        const std::string text(length, 'k');
        const Port_String s(text.c_str());
        ExpectWellFormed(s, text);
        EXPECT_EQ(HoldsInline(s), length <= 27);  // short texts stay inline, longer ones go to the heap
    }
}

TEST(StringBase, CopiesAreIndependentAndMovesHandTheBlockOver) {
    for (const std::string& text : {std::string("inline text"), std::string(64, 'h')}) {
        SCOPED_TRACE(text.size());
        Port_String original(text.c_str());
        Port_String copy(original), assigned;
        assigned = original;
        EXPECT_NE(copy.c_str(), original.c_str());
        EXPECT_NE(assigned.c_str(), original.c_str());
        copy += "+";
        assigned = "other";
        ExpectWellFormed(original, text);
        ExpectWellFormed(copy, text + "+");
        ExpectWellFormed(assigned, "other");

        const char* heapText = HoldsInline(original) ? nullptr : original.c_str();
        Port_String moved(std::move(original));
        ExpectWellFormed(moved, text);
        ExpectWellFormed(original, "");  // NOLINT: the moved-from state is promised
        if (heapText) {
            EXPECT_EQ(moved.c_str(), heapText);  // the block is handed over, not copied
        }
        original += "again";
        ExpectWellFormed(original, "again");
        Port_String target(std::string(50, 't').c_str());
        target = std::move(moved);
        ExpectWellFormed(target, text);
        ExpectWellFormed(moved, "");  // NOLINT
        target = std::move(target);
        ExpectWellFormed(target, text);
    }
}

TEST(StringBase, AssignAndAppendGrowAcrossTheInlineBorder) {
    Port_String s;
    std::string expected;
    for (int i = 0; i < 40; ++i) {
        const char piece[] = {static_cast<char>('a' + i % 26), '\0'};
        s += piece;
        expected += piece;
        ExpectWellFormed(s, expected);
    }
    EXPECT_FALSE(HoldsInline(s));
    s.Clear();
    ExpectWellFormed(s, "");
    EXPECT_TRUE(HoldsInline(s));
    s = std::string(300, 'z').c_str();
    ExpectWellFormed(s, std::string(300, 'z'));
}

TEST(StringBase, AppendKeepsEmbeddedBytesAndEqualityComparesThemAll) {
    Port_String s("head");
    s.Append("\0mid\0", 5);
    s += Port_String("tail");
    const std::string expected("head\0mid\0tail", 13);
    ExpectWellFormed(s, expected);
    const Port_String copy(s);
    ExpectWellFormed(copy, expected);
    EXPECT_TRUE(copy == s);
    EXPECT_FALSE(copy == Port_String("head"));
    s.Append(nullptr, 3);
    s.Append("ignored", 0);
    EXPECT_EQ(s.Length(), 13);

    const Port_String abc("abc");
    EXPECT_TRUE(abc == "abc");
    EXPECT_FALSE(abc == "abcd");
    EXPECT_FALSE(abc == "ABC");
    EXPECT_TRUE(abc == Port_String("a", "bc"));
    EXPECT_FALSE(abc == Port_String("abd"));
    EXPECT_TRUE(Port_String() == static_cast<const char*>(nullptr));
    EXPECT_FALSE(abc == static_cast<const char*>(nullptr));
}

TEST(StringBase, PartsOfItselfCanBeAssignedAndAppended) {
    for (const std::string& text : {std::string("0123456789"), std::string(30, 'x').replace(3, 2, "ab")}) {
        SCOPED_TRACE(text);
        Port_String s(text.c_str());
        s += s;
        ExpectWellFormed(s, text + text);
        s.Append(s.c_str() + 2, 5);
        ExpectWellFormed(s, text + text + text.substr(2, 5));
        s = s.c_str() + 3;
        ExpectWellFormed(s, (text + text + text.substr(2, 5)).substr(3));
    }
}

TEST(StringBase, NineTextConstructorJoinsUpToTheFirstNullAndDoFormatHasNoLimit) {
    ExpectWellFormed(Port_String("a", "b", "c", "d", "e", "f", "g", "h", "i"), "abcdefghi");
    ExpectWellFormed(Port_String("a", "b", nullptr, "d", "e"), "ab");
    ExpectWellFormed(Port_String("", ""), "");
    const std::string longPart(40, 'p');
    ExpectWellFormed(Port_String(longPart.c_str(), "-", longPart.c_str()), longPart + "-" + longPart);

    ExpectWellFormed(Port_String::doFormat("%s%d of %s", "::kelmar::IX", 7, "x"), "::kelmar::IX7 of x");
    ExpectWellFormed(Port_String::doFormat("%s", ""), "");
    const std::string part(5000, 'q');
    const Port_String longer = Port_String::doFormat("<%s|%05d|%s>", part.c_str(), 42, part.c_str());
    ExpectWellFormed(longer, "<" + part + "|00042|" + part + ">");
}

TEST(StringBase, CompareExactAndIgnoringCase) {
    struct Case { const char* text; const char* other; Port::CompareType type; int sign; };
    const Case cases[] = {
        {"null", "NULL", Port::CompareNoCase, 0},   {"NuLl", "NULL", Port::CompareNoCase, 0},
        {"null", "NULL", Port::CompareExact, 1},    {"NULL", "NULL", Port::CompareExact, 0},
        {"NULLS", "NULL", Port::CompareNoCase, 1},  {"NUL", "NULL", Port::CompareNoCase, -1},
        {"abc", "abd", Port::CompareExact, -1},     {"ABD", "abc", Port::CompareNoCase, 1},
        {"", nullptr, Port::CompareExact, 0},       {"x", nullptr, Port::CompareNoCase, 1},
        {"", "x", Port::CompareExact, -1},          {"\xe9", "\xc9", Port::CompareNoCase, 1},
        {"[", "a", Port::CompareExact, -1},         {"[", "A", Port::CompareNoCase, -1},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.text) + " vs " + Shown(c.other));
        EXPECT_EQ(Sign(Port_String(c.text).Compare(c.other, c.type)), c.sign);
    }
}

TEST(StringBase, ReplaceEveryOccurrence) {
    struct Case { const char *text, *from, *to; Port::CompareType type; const char* expected; int count; };
    const Case cases[] = {
        {"::kelmar::ICollection7", "::kelmar::", "", Port::CompareExact, "ICollection7", 1},
        {"a::kelmar::b::kelmar::::kelmar::", "::kelmar::", "", Port::CompareExact, "ab", 3},
        {"::KELMAR::x", "::kelmar::", "", Port::CompareExact, "::KELMAR::x", 0},
        {"::KELMAR::x", "::kelmar::", "", Port::CompareNoCase, "x", 1},
        {"xAbyaBzab", "ab", "-", Port::CompareNoCase, "x-y-z-", 3},
        {"xAbyaBzab", "ab", "-", Port::CompareExact, "xAbyaBz-", 1},
        {"aaaa", "aa", "b", Port::CompareExact, "bb", 2},
        {"aaa", "aa", "b", Port::CompareExact, "ba", 1},
        {"a.b.c.d", ".", " and then ", Port::CompareExact, "a and then b and then c and then d", 3},
        {"abc", "", "x", Port::CompareExact, "abc", 0},
        {"abc", nullptr, "x", Port::CompareExact, "abc", 0},
        {"abc", "b", nullptr, Port::CompareExact, "ac", 1},
        {"ab", "abc", "", Port::CompareExact, "ab", 0},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.text) + " / " + Shown(c.from));
        Port_String s(c.text);
        EXPECT_EQ(s.Replace(c.from, c.to, c.type), c.count);
        ExpectWellFormed(s, c.expected);
    }
    Port_String nuls("x::kelmar::", 11);
    nuls.Append("\0::kelmar::y", 12);
    EXPECT_EQ(nuls.Replace("::kelmar::", "", Port::CompareExact), 2);
    ExpectWellFormed(nuls, std::string("x\0y", 3));
}

TEST(StringBase, TrimRemovesOneLeadingInstance) {
    struct Case { const char* text; const char* cut; const char* expected; bool trimmed; };
    const Case cases[] = {
        {"-order", "-", "order", true}, {"--x", "-", "-x", true},  {"x-", "-", "x-", false},
        {"-", "-", "", true},           {"", "-", "", false},      {"abab", "ab", "ab", true},
        {"abc", "", "abc", false},      {"a", "abc", "a", false},  {"x", nullptr, "x", false},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.text) + " / " + Shown(c.cut));
        Port_String s(c.text);
        EXPECT_EQ(s.Trim(c.cut, Port::TrimLeadingOnce), c.trimmed);
        ExpectWellFormed(s, c.expected);
    }
    std::string dashed(61, 'w');
    dashed[0] = '-';
    Port_String heap(dashed.c_str());
    EXPECT_TRUE(heap.Trim("-", Port::TrimLeadingOnce));
    ExpectWellFormed(heap, std::string(60, 'w'));
}

// ---------------------------------------------------------------------------------------------
// Port::XUID

TEST(XUID, TextFormRoundTrips) {
    struct Case { uint64_t first; uint64_t second; const char* text; };
    const Case cases[] = {
        {0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc67ull, "46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67"},
        {0x0bdbaa0c7a484445ull, 0xac0790e9b86a6c67ull, "0bdbaa0c-7a48-4445-ac07-90e9b86a6c67"},
        {0, 1, "00000000-0000-0000-0000-000000000001"},
        {~0ull, ~0ull, "ffffffff-ffff-ffff-ffff-ffffffffffff"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(c.text);
        const Port::XUID id(c.first, c.second);
        ExpectWellFormed(id.ToString(), c.text);
        const Port::XUID back(c.text);
        EXPECT_EQ(back.First(), c.first);
        EXPECT_EQ(back.Second(), c.second);
        std::string upper = c.text;
        for (char& ch : upper) ch = static_cast<char>(std::toupper(static_cast<unsigned char>(ch)));
        EXPECT_TRUE(Port::XUID(upper.c_str()) == id);
        std::string braced("{");
        braced.append(c.text).append("}");
        EXPECT_TRUE(Port::XUID(braced.c_str()) == id);
    }
}

TEST(XUID, TextThatIsNoIdentifierGivesZero) {
    const char* const texts[] = {
        nullptr, "", "::kelmar::ICollection7",
        "46d2ad52-7068-4ab8-81b4-5c9aa2b2cc6",     // one digit short
        "46d2ad52-7068-4ab8-81b4-5c9aa2b2cc677",   // one digit long
        "46d2ad52-7068-4ab8-81b4-5c9aa2b2cc6g",    // not hex
        "46d2ad527-068-4ab8-81b4-5c9aa2b2cc67",    // dash moved
        "46d2ad52-7068-4ab8-81b4+5c9aa2b2cc67",    // no dash
        "46d2ad5270684ab881b45c9aa2b2cc67",        // no dashes at all
        "{46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67",   // brace not closed
        "46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67}",   // brace not opened
        "(46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67)",  // other brackets
        " 46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67",   // space in front
    };
    for (const char* text : texts) {
        SCOPED_TRACE(Shown(text));
        const Port::XUID id(text);
        EXPECT_TRUE(id.IsNull());
        EXPECT_EQ(id.First(), 0u);
        EXPECT_EQ(id.Second(), 0u);
    }
}

TEST(XUID, EqualityIgnoresTheFlagByte) {
    static_assert(sizeof(Port::XUID) == sizeof(void*) + 3 * sizeof(uint64_t), "vtable, halves, flag");
    Port::XUID flagged(0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc67ull);
    const Port::XUID plain(0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc67ull);
    reinterpret_cast<unsigned char*>(&flagged)[sizeof(void*) + 2 * sizeof(uint64_t)] = 1;
    EXPECT_NE(std::memcmp(&flagged, &plain, sizeof(void*) + 2 * sizeof(uint64_t) + 1), 0);
    EXPECT_TRUE(flagged == plain);
    EXPECT_TRUE((flagged == Port::XUIDLiteral{0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc67ull}));
    EXPECT_FALSE(flagged == Port::XUID(0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc68ull));
    EXPECT_FALSE(flagged == Port::XUID(0x46d2ad5270684ab9ull, 0x81b45c9aa2b2cc67ull));
}

// ---------------------------------------------------------------------------------------------
// Port::MsgData and UT_STR

TEST(MsgData, KeepsGroupAndKindAndFormats) {
    const Port::MsgData msg("TclTasksI", "ERROR");
    EXPECT_STREQ(msg.Group(), "TclTasksI");
    EXPECT_STREQ(msg.Kind(), "ERROR");
    ExpectWellFormed(msg.TranslateMsg("Option \"%s\" at %d.", "-ord", 4), "Option \"-ord\" at 4.");
    ExpectWellFormed(msg.TranslateMsg("no arguments"), "no arguments");
    const std::string words(700, 'w');
    ExpectWellFormed(msg.TranslateMsg("[%s]", words.c_str()), "[" + words + "]");
}

TEST(UT_STR, CompareIsByteForByte) {
    struct Case { const char* a; const char* b; int sign; };
    const Case cases[] = {
        {nullptr, nullptr, 0}, {nullptr, "", -1},  {"", nullptr, 1},   {"", "", 0},
        {"abc", "abc", 0},     {"abc", "ABC", 1},  {"ab", "abc", -1},  {"abd", "abc", 1},
        {"\xff", "a", 1},      {"a", "\xff", -1},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(Shown(c.a) + " vs " + Shown(c.b));
        EXPECT_EQ(Sign(UT_STR::_Compare(c.a, c.b)), c.sign);
    }
    const char text[] = "same";
    EXPECT_EQ(UT_STR::_Compare(text, text), 0);
}

// ---------------------------------------------------------------------------------------------
// CitP::Factory

using Factory = CitP::Factory;
using Table = CitP::InstanceTable;

constexpr Port::XUIDLiteral kWidgetClassID{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f30ull};
constexpr Port::XUIDLiteral kUnknownClassID{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f31ull};

// A counted test component that tells which creator made it.
class Widget final : public CitI::IInterface {
public:
    explicit Widget(int maker) : m_maker(maker), m_counter(this) { Table::Born(kWidgetClassID); }
    ~Widget() override { Table::Died(kWidgetClassID, "widget"); }

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == CommonI::IRefCountID) return &m_counter;
        if (id == CitI::IInterfaceID) return this;
        return nullptr;
    }
    int Maker() const { return m_maker; }
    long References() const { return m_counter.Count(); }

private:
    int m_maker;
    CommonI::RefCounter m_counter;
};

CitI::IInterface* MakeWidgetOne() { return new Widget(1); }
CitI::IInterface* MakeWidgetTwo() { return new Widget(2); }
CitI::IInterface* MakeNothing() { return nullptr; }

// Sets a filter for the length of a test, and clears it on every way out.
class FilterScope {
public:
    explicit FilterScope(Factory::LoadFilter filter) { Factory::SetLoadFilter(filter); }
    explicit FilterScope(Factory::CreateFilter filter) { Factory::SetCreateFilter(filter); }
    ~FilterScope() {
        Factory::SetLoadFilter(nullptr);
        Factory::SetCreateFilter(nullptr);
    }
};

std::vector<std::string> g_filteredNames;
bool Filtered(const char* name, bool allowed) { return g_filteredNames.emplace_back(name), allowed; }
bool RefuseLoad(const char* name) { return Filtered(name, false); }
bool AllowLoad(const char* name) { return Filtered(name, true); }
bool RefuseWidgets(const Port::XUID& classId) { return !(classId == kWidgetClassID); }

TEST(Factory, CreatesByTheLatestCreatorWithOneReferenceUnlessFiltered) {
    Factory::RegisterClass(kWidgetClassID, &MakeWidgetOne);
    Factory::RegisterClass(kWidgetClassID, &MakeWidgetTwo);
    EXPECT_TRUE(Factory::IsRegistered(kWidgetClassID));
    const long liveBefore = Table::Live(kWidgetClassID);
    {
        const CitI::MIInterface made = Factory::CreateInstanceRef(kWidgetClassID);
        ASSERT_TRUE(made);
        const auto& widget = dynamic_cast<const Widget&>(*made);
        EXPECT_EQ(widget.Maker(), 2);
        EXPECT_EQ(widget.References(), 1);
        EXPECT_EQ(Table::Live(kWidgetClassID), liveBefore + 1);
    }
    EXPECT_EQ(Table::Live(kWidgetClassID), liveBefore);  // the last reference ended it
    {
        const FilterScope scope(&RefuseWidgets);
        EXPECT_FALSE(Factory::CreateInstanceRef(kWidgetClassID));
        EXPECT_TRUE(Factory::IsRegistered(kWidgetClassID));
    }
    EXPECT_TRUE(Factory::CreateInstanceRef(kWidgetClassID));
}

TEST(Factory, NoInstanceWithoutACreator) {
    EXPECT_FALSE(Factory::IsRegistered(kUnknownClassID));
    EXPECT_FALSE(Factory::CreateInstanceRef(kUnknownClassID));
    EXPECT_FALSE(Factory::CreateInstanceRef(Port::XUID()));
    constexpr Port::XUIDLiteral emptyHanded{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f32ull};
    Factory::RegisterClass(emptyHanded, &MakeNothing);
    EXPECT_FALSE(Factory::CreateInstanceRef(emptyHanded));
    constexpr Port::XUIDLiteral withdrawn{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f33ull};
    Factory::RegisterClass(withdrawn, &MakeWidgetOne);
    Factory::RegisterClass(withdrawn, nullptr);
    EXPECT_FALSE(Factory::IsRegistered(withdrawn));
    EXPECT_FALSE(Factory::CreateInstanceRef(withdrawn));
}

// The folder that holds the fixture library and libPortBase.so, with its slash.
std::string LibraryFolder() {
    const std::string path = PORT_FIXTURE_PATH;
    return path.substr(0, path.rfind('/') + 1);
}

// The cache keeps names as they were asked for: this spelling of the fixture's path is a name that
// no other test asks for, so its first load really opens the library.
TEST(FactoryLibraries, FilterIsAskedBeforeTheCacheAndOnlyTheFirstLoadOpens) {
    const std::string path = PORT_FIXTURE_PATH;
    const Port_String name((LibraryFolder() + "./" + path.substr(path.rfind('/') + 1)).c_str());
    g_filteredNames.clear();
    const int opens = Factory::LibraryOpenCount();
    // Refused before any open; opened once; cached, and still refused; then answered from the cache.
    const struct { Factory::LoadFilter filter; bool loads; int opened; } steps[] = {
        {&RefuseLoad, false, 0}, {nullptr, true, 1}, {&RefuseLoad, false, 1}, {&AllowLoad, true, 1},
        {nullptr, true, 1},      {nullptr, true, 1}, {nullptr, true, 1},
    };
    for (const auto& step : steps) {
        SCOPED_TRACE(&step - steps);
        const FilterScope scope(step.filter);
        EXPECT_EQ(Factory::LoadLibraryFactory(name), step.loads);
        EXPECT_EQ(Factory::LibraryOpenCount(), opens + step.opened);
    }
    EXPECT_TRUE(Factory::IsRegistered(PortFixtureClassID));
    EXPECT_EQ(g_filteredNames, std::vector<std::string>(3, name.c_str()));

    const long live = Table::Live(PortFixtureClassID);
    {
        const CitI::MIInterface made = Factory::CreateInstanceRef(PortFixtureClassID);
        ASSERT_TRUE(made);
        EXPECT_NE(made->GetInterface(CitI::IInterfaceID), nullptr);
        EXPECT_EQ(Table::Live(PortFixtureClassID), live + 1);
    }
    EXPECT_EQ(Table::Live(PortFixtureClassID), live);
}

TEST(FactoryLibraries, BareNameIsFoundBesideThePortabilityLibrary) {
    ASSERT_TRUE(Factory::LoadLibraryFactory(Port_String(PORT_FIXTURE_NAME)));
    const int opens = Factory::LibraryOpenCount();
    EXPECT_TRUE(Factory::LoadLibraryFactory(Port_String(PORT_FIXTURE_NAME)));
    EXPECT_EQ(Factory::LibraryOpenCount(), opens);
    EXPECT_TRUE(Factory::IsRegistered(PortFixtureClassID));
}

TEST(FactoryLibraries, FailedLoadsAreNotCached) {
    const std::string noRegistration = LibraryFolder() + "libPortBase.so";
    const char* const missing[] = {"libno_such_component", "/nonexistent/folder/libno_such_component.so", ""};
    const int opens = Factory::LibraryOpenCount();
    for (int round = 0; round < 2; ++round) {
        for (const char* name : missing) {
            SCOPED_TRACE(name);
            EXPECT_FALSE(Factory::LoadLibraryFactory(Port_String(name)));
        }
        EXPECT_EQ(Factory::LibraryOpenCount(), opens + round);
        // It opens, but it has no registration function: closed again, and opened again next time.
        EXPECT_FALSE(Factory::LoadLibraryFactory(Port_String(noRegistration.c_str())));
        EXPECT_EQ(Factory::LibraryOpenCount(), opens + round + 1);
    }
}

// ---------------------------------------------------------------------------------------------
// CitP::InstanceTable

struct Death { uint64_t first; std::string detail; bool hadDetail; void* context; };
std::vector<Death> g_deaths;
void RecordDeath(const Port::XUID& classId, const char* detail, void* context) {
    g_deaths.push_back(Death{classId.First(), detail ? detail : "", detail != nullptr, context});
}

class ObserverScope {
public:
    explicit ObserverScope(void* context) {
        g_deaths.clear();
        Table::SetObserver(&RecordDeath, context);
    }
    ~ObserverScope() { Table::SetObserver(nullptr, nullptr); }
};

TEST(InstanceTable, CountsPerClassAndTellsTheObserverOfEveryDeath) {
    const Port::XUID a(0x1111, 1), b(0x1111, 2);
    const long liveA = Table::Live(a), liveB = Table::Live(b);
    int context = 0;
    {
        const ObserverScope scope(&context);
        Table::Born(a);
        Table::Born(a);
        Table::Born(b);
        EXPECT_TRUE(g_deaths.empty());
        EXPECT_EQ(Table::Live(a), liveA + 2);
        EXPECT_EQ(Table::Live(b), liveB + 1);
        Table::Died(a, "first of two");
        EXPECT_EQ(Table::Live(a), liveA + 1);
        EXPECT_EQ(Table::Live(b), liveB + 1);
        Table::Died(a, nullptr);
        ASSERT_EQ(g_deaths.size(), 2u);
        EXPECT_EQ(g_deaths[0].first, 0x1111u);
        EXPECT_EQ(g_deaths[0].detail, "first of two");
        EXPECT_TRUE(g_deaths[0].hadDetail);
        EXPECT_EQ(g_deaths[0].context, &context);
        EXPECT_FALSE(g_deaths[1].hadDetail);
    }
    Table::Died(b, "unobserved");
    EXPECT_EQ(g_deaths.size(), 2u);
    EXPECT_EQ(Table::Live(a), liveA);
    EXPECT_EQ(Table::Live(b), liveB);
    EXPECT_EQ(Table::Live(Port::XUID(0x1111, 3)), 0);
}

// ---------------------------------------------------------------------------------------------
// Init objects

template <class Init>
void ExpectCounted(int (*count)()) {
    const int before = count();
    {
        const Init one;
        {
            const Init two;
            EXPECT_EQ(count(), before + 2);
        }
        EXPECT_EQ(count(), before + 1);
    }
    EXPECT_EQ(count(), before);
}

TEST(InitObjects, EachKindCountsItsOwn) {
    ExpectCounted<Port::FileInit>(&Port::FileInitCount);
    ExpectCounted<Port::PathListInit>(&Port::PathListInitCount);
    ExpectCounted<CitP::InstanceTableInit>(&CitP::InstanceTableInitCount);
    ExpectCounted<CitP::FactoryInit>(&CitP::FactoryInitCount);
    const int files = Port::FileInitCount();
    const Port::PathListInit paths;
    EXPECT_EQ(Port::FileInitCount(), files);
}

// The tables go down with the last init object, and come up again on the next use. When another
// module in this process holds the layer up, the tables must survive instead. A death after the
// instance table went down still reaches the observer.
TEST(InitObjects, TablesLiveAsLongAsTheirInitObjects) {
    const bool factoryHeld = CitP::FactoryInitCount() > 0, tableHeld = CitP::InstanceTableInitCount() > 0;
    const Port::XUID id(0x3333, 1);
    const long live = Table::Live(id);
    Factory::RegisterClass(kWidgetClassID, &MakeWidgetOne);
    {
        const CitP::FactoryInit first, second;
        const CitP::InstanceTableInit init;
        EXPECT_TRUE(Factory::IsRegistered(kWidgetClassID));
        Table::Born(id);
        EXPECT_EQ(Table::Live(id), live + 1);
    }
    EXPECT_EQ(Factory::IsRegistered(kWidgetClassID), factoryHeld);
    EXPECT_EQ(Table::Live(id), tableHeld ? live + 1 : 0);
    int context = 0;
    {
        const ObserverScope scope(&context);
        Table::Died(id, "late");
        ASSERT_EQ(g_deaths.size(), 1u);
        EXPECT_EQ(g_deaths[0].detail, "late");
    }
    EXPECT_EQ(Table::Live(id), tableHeld ? live : 0);
    Factory::RegisterClass(kWidgetClassID, &MakeWidgetTwo);
    const CitI::MIInterface made = Factory::CreateInstanceRef(kWidgetClassID);
    ASSERT_TRUE(made);
    EXPECT_EQ(dynamic_cast<const Widget&>(*made).Maker(), 2);
}

struct Block : Port::Recycled<Block, 2> {
    virtual ~Block() = default;
    int payload[4] = {};
};
struct Bigger final : Block {
    int more[8] = {};
};

// The shelf is checked by the addresses it hands out: a block on a shelf is still allocated, so the
// heap cannot hand it out again by chance.
TEST(Recycled, BlocksGoBackToTheirOwnThreadUpToTheShelfLength) {
    if (!Port::kRecycleBlocks) GTEST_SKIP() << "every block goes to the heap under AddressSanitizer";
    Block* made[3] = {new Block, new Block, new Block};
    for (Block* block : made) delete block;  // the third finds the shelf full
    void* onShelf[2] = {made[1], made[0]};
    void* fromOtherThread = nullptr;
    std::thread([&] {
        auto* block = new Block;
        fromOtherThread = block;
        delete block;
    }).join();
    EXPECT_NE(fromOtherThread, onShelf[0]);
    EXPECT_NE(fromOtherThread, onShelf[1]);
    Block* bigger = new Bigger;
    EXPECT_NE(static_cast<void*>(bigger), onShelf[0]) << "a derived class of another size asks the heap";
    delete bigger;  // and goes back to it: the shelf still holds the two blocks of this thread
    Block* again[2] = {new Block, new Block};
    EXPECT_EQ(static_cast<void*>(again[0]), onShelf[0]) << "the last block given back is taken first";
    EXPECT_EQ(static_cast<void*>(again[1]), onShelf[1]);
    EXPECT_EQ(again[0]->payload[0], 0) << "a recycled block is constructed anew";
    for (Block* block : again) delete block;
}

}  // namespace
