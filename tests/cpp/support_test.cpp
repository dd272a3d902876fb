// The property component, made through the factory, with real Tcl values.
#include <dlfcn.h>
#include <gtest/gtest.h>
#include <tcl.h>
#include <unistd.h>

#include <climits>
#include <cstdlib>
#include <string>
#include <vector>

#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "UtilI/ITclProperty.h"

namespace {

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

class TclAndLibrary : public ::testing::Environment {
public:
    void SetUp() override {
        Tcl_FindExecutable(nullptr);
        g_probe.knownBefore = CitP::Factory::IsRegistered(UtilI::TclPropertyID);
        const std::string path = LibraryDir() + "/libTcltask_Support.so";
        if (!dlopen(path.c_str(), RTLD_NOW | RTLD_GLOBAL)) g_probe.openError = dlerror();
        g_probe.knownAfterOpen = CitP::Factory::IsRegistered(UtilI::TclPropertyID);
    }
};
const auto* g_env = ::testing::AddGlobalTestEnvironment(new TclAndLibrary);

// Records every end of life that the instance table reports while it is in scope.
class DeathLog {
public:
    DeathLog() { CitP::InstanceTable::SetObserver(&Note, this); }
    ~DeathLog() { CitP::InstanceTable::SetObserver(nullptr, nullptr); }
    std::vector<std::string> properties;

private:
    static void Note(const Port::XUID& classId, const char* detail, void* context) {
        if (classId == UtilI::TclPropertyID)
            static_cast<DeathLog*>(context)->properties.emplace_back(detail ? detail : "<null>");
    }
};

// A Tcl value that the test holds one reference of.
class Value {
public:
    explicit Value(const char* text) : m_obj(Tcl_NewStringObj(text, -1)) { Tcl_IncrRefCount(m_obj); }
    ~Value() { Tcl_DecrRefCount(m_obj); }
    Value(const Value&) = delete;
    Value& operator=(const Value&) = delete;
    Tcl_Obj* get() const { return m_obj; }
    int refs() const { return m_obj->refCount; }

private:
    Tcl_Obj* m_obj;
};

class Property : public ::testing::Test {
protected:
    static void SetUpTestSuite() { ASSERT_TRUE(CitP::Factory::LoadLibraryFactory("libTcltask_Support")); }

    static UtilI::MITclProperty Make() {
        UtilI::MITclProperty p(CitP::Factory::CreateInstanceRef(UtilI::TclPropertyID));
        EXPECT_TRUE(p);
        return p;
    }
    static std::string Text(UtilI::ITclProperty& p) {
        Tcl_Obj* out = nullptr;
        Port_String message;
        EXPECT_EQ(p.ToTclObj(out, message), 1);
        return out ? Tcl_GetString(out) : "<null>";
    }
};

TEST(PropertyLoad, LoadingTheLibraryRegistersTheClass) {
    EXPECT_FALSE(g_probe.knownBefore);
    EXPECT_EQ(g_probe.openError, "");
    EXPECT_TRUE(g_probe.knownAfterOpen);
}

TEST_F(Property, AnswersItsInterfaces) {
    auto p = Make();
    EXPECT_EQ(p->GetInterface(UtilI::ITclPropertyID), p.get());
    EXPECT_EQ(p->GetInterface(CitI::IInterfaceID), p.get());
    EXPECT_NE(p->GetInterface(CommonI::IRefCountID), nullptr);
    EXPECT_EQ(p->GetInterface(UtilI::TclPropertyID), nullptr);
}

TEST_F(Property, StartsEmptyAndGivesBackTheValueItTook) {
    auto p = Make();
    EXPECT_EQ(Text(*p), "");
    for (const char* text : {"(nil)", "nil", "", "two words", "{nil}"}) {
        Value v(text);
        Port_String message;
        ASSERT_EQ(p->FromTclObj(v.get(), message), 1);
        Tcl_Obj* out = nullptr;
        ASSERT_EQ(p->ToTclObj(out, message), 1);
        EXPECT_EQ(out, v.get()) << "the value itself, not a copy";
        EXPECT_STREQ(Tcl_GetString(out), text);
        EXPECT_STREQ(message.c_str(), "");
    }
}

TEST_F(Property, KeepsTheValuesInternalForm) {
    auto p = Make();
    Tcl_Obj* list = Tcl_NewListObj(0, nullptr);
    Tcl_IncrRefCount(list);
    Tcl_ListObjAppendElement(nullptr, list, Tcl_NewIntObj(7));
    Port_String message;
    ASSERT_EQ(p->FromTclObj(list, message), 1);
    Tcl_Obj* out = nullptr;
    ASSERT_EQ(p->ToTclObj(out, message), 1);
    int length = 0;
    EXPECT_EQ(Tcl_ListObjLength(nullptr, out, &length), TCL_OK);
    EXPECT_EQ(length, 1);
    Tcl_DecrRefCount(list);
}

TEST_F(Property, HoldsOneReferenceOfTheCurrentValue) {
    Value first("first");
    Value second("second");
    Port_String message;
    {
        auto p = Make();
        ASSERT_EQ(p->FromTclObj(first.get(), message), 1);
        EXPECT_EQ(first.refs(), 2);
        ASSERT_EQ(p->FromTclObj(first.get(), message), 1) << "the same value again";
        EXPECT_EQ(first.refs(), 2);
        ASSERT_EQ(p->FromTclObj(second.get(), message), 1);
        EXPECT_EQ(first.refs(), 1);
        EXPECT_EQ(second.refs(), 2);
    }
    EXPECT_EQ(second.refs(), 1) << "released with the property";
}

TEST_F(Property, TheOnlyReferenceSurvivesReplacingItWithItself) {
    auto p = Make();
    Port_String message;
    ASSERT_EQ(p->FromTclObj(Tcl_NewStringObj("only", -1), message), 1);
    Tcl_Obj* held = nullptr;
    ASSERT_EQ(p->ToTclObj(held, message), 1);
    ASSERT_EQ(p->FromTclObj(held, message), 1);
    EXPECT_EQ(Text(*p), "only");
}

TEST_F(Property, RefusesANullValue) {
    auto p = Make();
    Value v("kept");
    Port_String message;
    ASSERT_EQ(p->FromTclObj(v.get(), message), 1);
    EXPECT_EQ(p->FromTclObj(nullptr, message), 0);
    EXPECT_FALSE(message.IsEmpty());
    EXPECT_EQ(Text(*p), "kept");
}

TEST_F(Property, TellsItsValueWhenItEnds) {
    const long before = CitP::InstanceTable::Live(UtilI::TclPropertyID);
    DeathLog log;
    {
        auto a = Make();
        auto b = Make();
        auto untouched = Make();
        Value va("(nil)");
        Value vb("nil");
        Port_String message;
        a->FromTclObj(va.get(), message);
        b->FromTclObj(vb.get(), message);
        EXPECT_EQ(CitP::InstanceTable::Live(UtilI::TclPropertyID), before + 3);
        b = nullptr;
        auto copy = a;
        a = nullptr;
        EXPECT_EQ(log.properties, std::vector<std::string>{"nil"}) << "a second reference keeps it";
    }
    EXPECT_EQ(log.properties, (std::vector<std::string>{"nil", "(nil)", ""}));
    EXPECT_EQ(CitP::InstanceTable::Live(UtilI::TclPropertyID), before);
}

}  // namespace
