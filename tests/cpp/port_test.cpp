// The portability layer: strings, identifiers, messages, UT_STR, the component factory with its
// library cache, the instance table and the init objects.
#include <gtest/gtest.h>

#include <cctype>
#include <cstring>
#include <functional>
#include <string>
#include <vector>

#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "CommonI/RefCountPtr.h"
#include "Port/Init.h"
#include "Port/MsgData.h"
#include "Port/StringBase.h"
#include "Port/UT_STR.h"
#include "Port/XUID.h"
#include "fixtures/port_fixture.h"

namespace {

int32_t LengthWord(const Port_String& s) {
    int32_t word = 0;
    std::memcpy(&word, s.c_str() - sizeof(int32_t), sizeof(word));
    return word;
}

bool HoldsInline(const Port_String& s) {
    const char* object = reinterpret_cast<const char*>(&s);
    return std::less_equal<const char*>()(object, s.c_str()) &&
           std::less<const char*>()(s.c_str(), object + sizeof(s));
}

// Every byte of the string, embedded nuls included, and the nul behind them.
std::string Bytes(const Port_String& s) { return std::string(s.c_str(), static_cast<size_t>(s.Length())); }

void ExpectWellFormed(const Port_String& s, const std::string& expected) {
    EXPECT_EQ(Bytes(s), expected);
    EXPECT_EQ(s.Length(), static_cast<int32_t>(expected.size()));
    EXPECT_EQ(LengthWord(s), s.Length());
    EXPECT_EQ(s.c_str()[s.Length()], '\0');
}

// ---------------------------------------------------------------------------------------------
// Port::StringBase<char>

TEST(StringBase, EmptyStringIsValidText) {
    const Port_String empty;
    ExpectWellFormed(empty, "");
    EXPECT_TRUE(empty.IsEmpty());
    const Port_String fromNull(static_cast<const char*>(nullptr));
    ExpectWellFormed(fromNull, "");
    EXPECT_TRUE(empty == fromNull);
}

TEST(StringBase, ShortTextsStayInlineLongerOnesGoToTheHeap) {
    struct Case {
        size_t length;
        bool inlineExpected;
    };
    for (const Case& c : {Case{0, true}, Case{1, true}, Case{26, true}, Case{27, true}, Case{28, false},
                          Case{29, false}, Case{4000, false}}) {
        SCOPED_TRACE(c.length);
        const std::string text(c.length, 'k');
        const Port_String s(text.c_str());
        ExpectWellFormed(s, text);
        EXPECT_EQ(HoldsInline(s), c.inlineExpected);
    }
}

TEST(StringBase, ConstructorWithLengthKeepsEveryByte) {
    const char bytes[] = "ab\0cd";
    const Port_String s(bytes, 5);
    ExpectWellFormed(s, std::string(bytes, 5));
    EXPECT_FALSE(s == "ab");
    // A negative length reads up to the nul, as Tcl does.
    ExpectWellFormed(Port_String("up to nul", -1), "up to nul");
    ExpectWellFormed(Port_String(nullptr, 4), "");
}

TEST(StringBase, CopiesAreIndependent) {
    for (const std::string& text : {std::string("short"), std::string(100, 'L')}) {
        SCOPED_TRACE(text.size());
        Port_String original(text.c_str());
        Port_String copy(original);
        Port_String assigned;
        assigned = original;
        EXPECT_NE(copy.c_str(), original.c_str());
        EXPECT_NE(assigned.c_str(), original.c_str());
        copy += "+";
        assigned = "other";
        ExpectWellFormed(original, text);
        ExpectWellFormed(copy, text + "+");
        ExpectWellFormed(assigned, "other");
    }
}

TEST(StringBase, MoveLeavesTheSourceEmptyAndUsable) {
    for (const std::string& text : {std::string("inline text"), std::string(64, 'h')}) {
        SCOPED_TRACE(text.size());
        Port_String source(text.c_str());
        const char* heapText = HoldsInline(source) ? nullptr : source.c_str();
        Port_String moved(std::move(source));
        ExpectWellFormed(moved, text);
        ExpectWellFormed(source, "");  // NOLINT: the moved-from state is promised
        if (heapText) {
            EXPECT_EQ(moved.c_str(), heapText);  // the block is handed over, not copied
        }
        source += "again";
        ExpectWellFormed(source, "again");

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
    s = "short again";
    ExpectWellFormed(s, "short again");
    s = std::string(300, 'z').c_str();
    ExpectWellFormed(s, std::string(300, 'z'));
    s = "tiny";
    ExpectWellFormed(s, "tiny");
}

TEST(StringBase, AppendKeepsEmbeddedBytes) {
    Port_String s("head");
    s.Append("\0mid\0", 5);
    s += Port_String("tail");
    ExpectWellFormed(s, std::string("head\0mid\0tail", 13));
    const Port_String copy(s);
    ExpectWellFormed(copy, std::string("head\0mid\0tail", 13));
    EXPECT_TRUE(copy == s);
    EXPECT_FALSE(copy == Port_String("head"));
    s.Append(nullptr, 3);
    s.Append("ignored", 0);
    EXPECT_EQ(s.Length(), 13);
}

TEST(StringBase, PartsOfItselfCanBeAssignedAndAppended) {
    for (const std::string& text : {std::string("0123456789"), std::string("abcdefghijklmnopqrstuvwxyz0123456789")}) {
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

TEST(StringBase, NineTextConstructorJoinsUpToTheFirstNull) {
    ExpectWellFormed(Port_String("a", "b", "c", "d", "e", "f", "g", "h", "i"), "abcdefghi");
    ExpectWellFormed(Port_String("::kelmar::", "ICollection", "7"), "::kelmar::ICollection7");
    ExpectWellFormed(Port_String("a", "b", nullptr, "d", "e"), "ab");
    ExpectWellFormed(Port_String("", ""), "");
    const std::string longPart(40, 'p');
    ExpectWellFormed(Port_String(longPart.c_str(), "-", longPart.c_str()), longPart + "-" + longPart);
}

TEST(StringBase, EqualityComparesEveryByte) {
    const Port_String abc("abc");
    EXPECT_TRUE(abc == "abc");
    EXPECT_FALSE(abc == "abcd");
    EXPECT_FALSE(abc == "ABC");
    EXPECT_TRUE(abc == Port_String("a", "bc"));
    EXPECT_FALSE(abc == Port_String("abd"));
    EXPECT_TRUE(Port_String() == static_cast<const char*>(nullptr));
    EXPECT_FALSE(abc == static_cast<const char*>(nullptr));
}

TEST(StringBase, CompareExactAndIgnoringCase) {
    struct Case {
        const char* text;
        const char* other;
        Port::CompareType type;
        int sign;
    };
    const Case cases[] = {
        {"NULL", "NULL", Port::CompareNoCase, 0},   {"null", "NULL", Port::CompareNoCase, 0},
        {"NuLl", "NULL", Port::CompareNoCase, 0},   {"null", "NULL", Port::CompareExact, 1},
        {"NULL", "NULL", Port::CompareExact, 0},    {"NULLS", "NULL", Port::CompareNoCase, 1},
        {"NUL", "NULL", Port::CompareNoCase, -1},   {"abc", "abd", Port::CompareExact, -1},
        {"abd", "abc", Port::CompareExact, 1},      {"ABD", "abc", Port::CompareNoCase, 1},
        {"", nullptr, Port::CompareExact, 0},       {"x", nullptr, Port::CompareNoCase, 1},
        {"", "x", Port::CompareExact, -1},          {"\xe9", "\xc9", Port::CompareNoCase, 1},
        {"[", "a", Port::CompareExact, -1},         {"[", "A", Port::CompareNoCase, -1},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.text) + " vs " + (c.other ? c.other : "(null)"));
        const int result = Port_String(c.text).Compare(c.other, c.type);
        EXPECT_EQ((result > 0) - (result < 0), c.sign);
    }
}

TEST(StringBase, ReplaceEveryOccurrence) {
    struct Case {
        const char* text;
        const char* from;
        const char* to;
        Port::CompareType type;
        const char* expected;
        int count;
    };
    const Case cases[] = {
        {"::kelmar::ICollection7", "::kelmar::", "", Port::CompareExact, "ICollection7", 1},
        {"ICollection7", "::kelmar::", "", Port::CompareExact, "ICollection7", 0},
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
        SCOPED_TRACE(std::string(c.text) + " / " + (c.from ? c.from : "(null)"));
        Port_String s(c.text);
        EXPECT_EQ(s.Replace(c.from, c.to, c.type), c.count);
        ExpectWellFormed(s, c.expected);
    }
}

TEST(StringBase, ReplaceKeepsBytesAroundEmbeddedNuls) {
    Port_String s("x::kelmar::", 11);
    s.Append("\0::kelmar::y", 12);
    EXPECT_EQ(s.Replace("::kelmar::", "", Port::CompareExact), 2);
    ExpectWellFormed(s, std::string("x\0y", 3));
}

TEST(StringBase, TrimRemovesOneLeadingInstance) {
    struct Case {
        const char* text;
        const char* cut;
        const char* expected;
        bool trimmed;
    };
    const Case cases[] = {
        {"-order", "-", "order", true}, {"--x", "-", "-x", true},  {"x-", "-", "x-", false},
        {"-", "-", "", true},           {"", "-", "", false},      {"abab", "ab", "ab", true},
        {"abc", "", "abc", false},      {"a", "abc", "a", false},  {"x", nullptr, "x", false},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.text) + " / " + (c.cut ? c.cut : "(null)"));
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

TEST(StringBase, DoFormatHasNoLengthLimit) {
    ExpectWellFormed(Port_String::doFormat("%s%d of %s", "::kelmar::ICollection", 7, "x"),
                     "::kelmar::ICollection7 of x");
    ExpectWellFormed(Port_String::doFormat("%s", ""), "");
    const std::string part(5000, 'q');
    const Port_String longer = Port_String::doFormat("<%s|%05d|%s>", part.c_str(), 42, part.c_str());
    ExpectWellFormed(longer, "<" + part + "|00042|" + part + ">");
}

// ---------------------------------------------------------------------------------------------
// Port::XUID

TEST(XUID, TextFormRoundTrips) {
    struct Case {
        uint64_t first;
        uint64_t second;
        const char* text;
    };
    const Case cases[] = {
        {0x46d2ad5270684ab8ull, 0x81b45c9aa2b2cc67ull, "46d2ad52-7068-4ab8-81b4-5c9aa2b2cc67"},
        {0x0bdbaa0c7a484445ull, 0xac0790e9b86a6c67ull, "0bdbaa0c-7a48-4445-ac07-90e9b86a6c67"},
        {0xf35246530fb84605ull, 0xa6c16e80946a2cddull, "f3524653-0fb8-4605-a6c1-6e80946a2cdd"},
        {0x322ee09f0c9d4c98ull, 0xa0cf19abf1e3bfdfull, "322ee09f-0c9d-4c98-a0cf-19abf1e3bfdf"},
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
        nullptr,
        "",
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
        "::kelmar::ICollection7",
    };
    for (const char* text : texts) {
        SCOPED_TRACE(text ? text : "(null)");
        const Port::XUID id(text);
        EXPECT_TRUE(id.IsNull());
        EXPECT_EQ(id.First(), 0u);
        EXPECT_EQ(id.Second(), 0u);
    }
}

TEST(XUID, EqualityIgnoresTheFlagByte) {
    static_assert(sizeof(Port::XUID) == sizeof(void*) + 2 * sizeof(uint64_t) + sizeof(uint64_t),
                  "vtable pointer, two halves, the flag byte padded");
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
    ExpectWellFormed(msg.TranslateMsg("Unknown option \"%s\" at %d.", "-ord", 4), "Unknown option \"-ord\" at 4.");
    ExpectWellFormed(msg.TranslateMsg("no arguments"), "no arguments");
    const std::string words(700, 'w');
    ExpectWellFormed(msg.TranslateMsg("[%s]", words.c_str()), "[" + words + "]");
}

TEST(UT_STR, CompareIsByteForByte) {
    struct Case {
        const char* a;
        const char* b;
        int sign;
    };
    const Case cases[] = {
        {nullptr, nullptr, 0}, {nullptr, "", -1},  {"", nullptr, 1},    {"", "", 0},
        {"abc", "abc", 0},     {"abc", "ABC", 1},  {"ab", "abc", -1},   {"abd", "abc", 1},
        {"\xff", "a", 1},      {"a", "\xff", -1},  {nullptr, "x", -1},  {"x", nullptr, 1},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(c.a ? c.a : "(null)") + " vs " + (c.b ? c.b : "(null)"));
        const int result = UT_STR::_Compare(c.a, c.b);
        EXPECT_EQ((result > 0) - (result < 0), c.sign);
    }
    const char text[] = "same";
    EXPECT_EQ(UT_STR::_Compare(text, text), 0);
}

// ---------------------------------------------------------------------------------------------
// CitP::Factory

constexpr Port::XUIDLiteral kWidgetClassID{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f30ull};
constexpr Port::XUIDLiteral kUnknownClassID{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f31ull};

// A counted test component that tells which creator made it.
class Widget final : public CitI::IInterface {
public:
    explicit Widget(int maker) : m_maker(maker), m_counter(this) { CitP::InstanceTable::Born(kWidgetClassID); }
    ~Widget() override { CitP::InstanceTable::Died(kWidgetClassID, "widget"); }

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
    explicit FilterScope(CitP::Factory::LoadFilter filter) { CitP::Factory::SetLoadFilter(filter); }
    explicit FilterScope(CitP::Factory::CreateFilter filter) { CitP::Factory::SetCreateFilter(filter); }
    ~FilterScope() {
        CitP::Factory::SetLoadFilter(nullptr);
        CitP::Factory::SetCreateFilter(nullptr);
    }
};

std::vector<std::string> g_filteredNames;
bool RefuseLoad(const char* name) {
    g_filteredNames.emplace_back(name);
    return false;
}
bool AllowLoad(const char* name) {
    g_filteredNames.emplace_back(name);
    return true;
}
bool RefuseWidgets(const Port::XUID& classId) { return !(classId == kWidgetClassID); }

TEST(Factory, CreatesRegisteredClassesWithOneReference) {
    CitP::Factory::RegisterClass(kWidgetClassID, &MakeWidgetOne);
    EXPECT_TRUE(CitP::Factory::IsRegistered(kWidgetClassID));
    const long liveBefore = CitP::InstanceTable::Live(kWidgetClassID);
    {
        const CitI::MIInterface made = CitP::Factory::CreateInstanceRef(kWidgetClassID);
        ASSERT_TRUE(made);
        const auto* widget = dynamic_cast<const Widget*>(made.get());
        ASSERT_NE(widget, nullptr);
        EXPECT_EQ(widget->Maker(), 1);
        EXPECT_EQ(widget->References(), 1);
        EXPECT_EQ(CitP::InstanceTable::Live(kWidgetClassID), liveBefore + 1);
    }
    EXPECT_EQ(CitP::InstanceTable::Live(kWidgetClassID), liveBefore);  // the last reference ended it
}

TEST(Factory, RegisteringAgainReplacesTheCreator) {
    CitP::Factory::RegisterClass(kWidgetClassID, &MakeWidgetOne);
    CitP::Factory::RegisterClass(kWidgetClassID, &MakeWidgetTwo);
    const CitI::MIInterface made = CitP::Factory::CreateInstanceRef(kWidgetClassID);
    ASSERT_TRUE(made);
    EXPECT_EQ(dynamic_cast<const Widget&>(*made).Maker(), 2);
}

TEST(Factory, NoInstanceWithoutACreator) {
    EXPECT_FALSE(CitP::Factory::IsRegistered(kUnknownClassID));
    EXPECT_FALSE(CitP::Factory::CreateInstanceRef(kUnknownClassID));
    EXPECT_FALSE(CitP::Factory::CreateInstanceRef(Port::XUID()));

    constexpr Port::XUIDLiteral emptyHanded{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f32ull};
    CitP::Factory::RegisterClass(emptyHanded, &MakeNothing);
    EXPECT_FALSE(CitP::Factory::CreateInstanceRef(emptyHanded));
    constexpr Port::XUIDLiteral withdrawn{0x5a1e0c3bd7f24e61ull, 0xb08d4c2e97a15f33ull};
    CitP::Factory::RegisterClass(withdrawn, &MakeWidgetOne);
    CitP::Factory::RegisterClass(withdrawn, nullptr);
    EXPECT_FALSE(CitP::Factory::IsRegistered(withdrawn));
    EXPECT_FALSE(CitP::Factory::CreateInstanceRef(withdrawn));
}

TEST(Factory, CreateFilterRefusesCreation) {
    CitP::Factory::RegisterClass(kWidgetClassID, &MakeWidgetOne);
    {
        const FilterScope scope(&RefuseWidgets);
        EXPECT_FALSE(CitP::Factory::CreateInstanceRef(kWidgetClassID));
        EXPECT_TRUE(CitP::Factory::IsRegistered(kWidgetClassID));
    }
    EXPECT_TRUE(CitP::Factory::CreateInstanceRef(kWidgetClassID));
}

// The folder that holds the fixture library and libPortBase.so, with its slash.
std::string LibraryFolder() {
    const std::string path = PORT_FIXTURE_PATH;
    return path.substr(0, path.rfind('/') + 1);
}

// The cache keeps names as they were asked for: a new spelling of the fixture's path is a name
// that no earlier test has had answered, so its first load really opens the library.
std::string FreshFixtureSpelling() {
    static int spellings = 0;
    const std::string path = PORT_FIXTURE_PATH;
    std::string dots;
    for (int i = 0; i <= spellings; ++i) dots += "./";
    ++spellings;
    return LibraryFolder() + dots + path.substr(path.rfind('/') + 1);
}

TEST(FactoryLibraries, SecondLoadIsAnsweredFromTheCache) {
    const Port_String name(FreshFixtureSpelling().c_str());
    const int opens = CitP::Factory::LibraryOpenCount();
    EXPECT_TRUE(CitP::Factory::LoadLibraryFactory(name));
    EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens + 1);
    EXPECT_TRUE(CitP::Factory::IsRegistered(PortFixtureClassID));
    for (int i = 0; i < 3; ++i) EXPECT_TRUE(CitP::Factory::LoadLibraryFactory(name));
    EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens + 1);

    const long live = CitP::InstanceTable::Live(PortFixtureClassID);
    {
        const CitI::MIInterface made = CitP::Factory::CreateInstanceRef(PortFixtureClassID);
        ASSERT_TRUE(made);
        EXPECT_NE(made->GetInterface(CitI::IInterfaceID), nullptr);
        EXPECT_EQ(CitP::InstanceTable::Live(PortFixtureClassID), live + 1);
    }
    EXPECT_EQ(CitP::InstanceTable::Live(PortFixtureClassID), live);
}

TEST(FactoryLibraries, BareNameIsFoundBesideThePortabilityLibrary) {
    const Port_String name(PORT_FIXTURE_NAME);
    ASSERT_TRUE(CitP::Factory::LoadLibraryFactory(name));
    const int opens = CitP::Factory::LibraryOpenCount();
    EXPECT_TRUE(CitP::Factory::LoadLibraryFactory(Port_String(PORT_FIXTURE_NAME)));
    EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens);
    EXPECT_TRUE(CitP::Factory::IsRegistered(PortFixtureClassID));
}

TEST(FactoryLibraries, FailedLoadsAreNotCached) {
    const std::string noRegistration = LibraryFolder() + "libPortBase.so";
    const char* const missing[] = {"libno_such_component", "/nonexistent/folder/libno_such_component.so", ""};
    const int opens = CitP::Factory::LibraryOpenCount();
    for (int round = 0; round < 2; ++round) {
        for (const char* name : missing) {
            SCOPED_TRACE(name);
            EXPECT_FALSE(CitP::Factory::LoadLibraryFactory(Port_String(name)));
        }
        EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens + round);
        // It opens, but it has no registration function: closed again, and opened again next time.
        EXPECT_FALSE(CitP::Factory::LoadLibraryFactory(Port_String(noRegistration.c_str())));
        EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens + round + 1);
    }
}

TEST(FactoryLibraries, LoadFilterIsAskedBeforeTheCache) {
    const Port_String name(FreshFixtureSpelling().c_str());
    g_filteredNames.clear();
    const int opens = CitP::Factory::LibraryOpenCount();
    {
        const FilterScope scope(&RefuseLoad);
        EXPECT_FALSE(CitP::Factory::LoadLibraryFactory(name));
        EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens);  // refused before any open
    }
    ASSERT_TRUE(CitP::Factory::LoadLibraryFactory(name));
    EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens + 1);
    {
        const FilterScope scope(&RefuseLoad);
        EXPECT_FALSE(CitP::Factory::LoadLibraryFactory(name));  // cached, and still refused
    }
    {
        const FilterScope scope(&AllowLoad);
        EXPECT_TRUE(CitP::Factory::LoadLibraryFactory(name));
    }
    EXPECT_TRUE(CitP::Factory::LoadLibraryFactory(name));
    EXPECT_EQ(CitP::Factory::LibraryOpenCount(), opens + 1);
    const std::vector<std::string> expected(3, name.c_str());
    EXPECT_EQ(g_filteredNames, expected);
}

// ---------------------------------------------------------------------------------------------
// CitP::InstanceTable

struct Death {
    uint64_t first;
    std::string detail;
    bool hadDetail;
    void* context;
};
std::vector<Death> g_deaths;
void RecordDeath(const Port::XUID& classId, const char* detail, void* context) {
    g_deaths.push_back(Death{classId.First(), detail ? detail : "", detail != nullptr, context});
}

class ObserverScope {
public:
    explicit ObserverScope(void* context) {
        g_deaths.clear();
        CitP::InstanceTable::SetObserver(&RecordDeath, context);
    }
    ~ObserverScope() { CitP::InstanceTable::SetObserver(nullptr, nullptr); }
};

TEST(InstanceTable, CountsLiveInstancesPerClass) {
    const Port::XUID a(0x1111, 1);
    const Port::XUID b(0x1111, 2);
    const long liveA = CitP::InstanceTable::Live(a);
    const long liveB = CitP::InstanceTable::Live(b);
    CitP::InstanceTable::Born(a);
    CitP::InstanceTable::Born(a);
    CitP::InstanceTable::Born(b);
    EXPECT_EQ(CitP::InstanceTable::Live(a), liveA + 2);
    EXPECT_EQ(CitP::InstanceTable::Live(b), liveB + 1);
    CitP::InstanceTable::Died(a, nullptr);
    EXPECT_EQ(CitP::InstanceTable::Live(a), liveA + 1);
    EXPECT_EQ(CitP::InstanceTable::Live(b), liveB + 1);
    CitP::InstanceTable::Died(a, nullptr);
    CitP::InstanceTable::Died(b, nullptr);
    EXPECT_EQ(CitP::InstanceTable::Live(a), liveA);
    EXPECT_EQ(CitP::InstanceTable::Live(b), liveB);
    EXPECT_EQ(CitP::InstanceTable::Live(Port::XUID(0x1111, 3)), 0);
}

TEST(InstanceTable, ObserverHearsEveryDeath) {
    int context = 0;
    const Port::XUID id(0x2222, 1);
    {
        const ObserverScope scope(&context);
        CitP::InstanceTable::Born(id);
        CitP::InstanceTable::Born(id);
        EXPECT_TRUE(g_deaths.empty());
        CitP::InstanceTable::Died(id, "first of two");
        CitP::InstanceTable::Died(id, nullptr);
        ASSERT_EQ(g_deaths.size(), 2u);
        EXPECT_EQ(g_deaths[0].first, 0x2222u);
        EXPECT_EQ(g_deaths[0].detail, "first of two");
        EXPECT_TRUE(g_deaths[0].hadDetail);
        EXPECT_EQ(g_deaths[0].context, &context);
        EXPECT_FALSE(g_deaths[1].hadDetail);
    }
    CitP::InstanceTable::Born(id);
    CitP::InstanceTable::Died(id, "unobserved");
    EXPECT_EQ(g_deaths.size(), 2u);
}

// ---------------------------------------------------------------------------------------------
// Init objects

template <class Init>
void ExpectCounted(int (*count)()) {
    const int before = count();
    {
        const Init one;
        EXPECT_EQ(count(), before + 1);
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
// module in this process holds the layer up, the tables must survive instead.
TEST(InitObjects, FactoryTableLivesAsLongAsItsInitObjects) {
    const int held = CitP::FactoryInitCount();
    CitP::Factory::RegisterClass(kWidgetClassID, &MakeWidgetOne);
    {
        const CitP::FactoryInit first;
        const CitP::FactoryInit second;
        EXPECT_TRUE(CitP::Factory::IsRegistered(kWidgetClassID));
    }
    EXPECT_EQ(CitP::Factory::IsRegistered(kWidgetClassID), held > 0);
    CitP::Factory::RegisterClass(kWidgetClassID, &MakeWidgetTwo);
    const CitI::MIInterface made = CitP::Factory::CreateInstanceRef(kWidgetClassID);
    ASSERT_TRUE(made);
    EXPECT_EQ(dynamic_cast<const Widget&>(*made).Maker(), 2);
}

TEST(InitObjects, InstanceTableLivesAsLongAsItsInitObjects) {
    const int held = CitP::InstanceTableInitCount();
    const Port::XUID id(0x3333, 1);
    const long live = CitP::InstanceTable::Live(id);
    {
        const CitP::InstanceTableInit init;
        CitP::InstanceTable::Born(id);
        EXPECT_EQ(CitP::InstanceTable::Live(id), live + 1);
    }
    EXPECT_EQ(CitP::InstanceTable::Live(id), held > 0 ? live + 1 : 0);
    // A death after the table went down still reaches the observer.
    int context = 0;
    {
        const ObserverScope scope(&context);
        CitP::InstanceTable::Died(id, "late");
        ASSERT_EQ(g_deaths.size(), 1u);
        EXPECT_EQ(g_deaths[0].detail, "late");
    }
    EXPECT_EQ(CitP::InstanceTable::Live(id), held > 0 ? live : 0);
}

}  // namespace
