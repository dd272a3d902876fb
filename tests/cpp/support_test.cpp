// The property component, made through the factory, with real Tcl values.
#include <dlfcn.h>
#include <gtest/gtest.h>
#include <tcl.h>

#include <filesystem>
#include <string>
#include <vector>

#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "UtilI/ITclProperty.h"

namespace {

// Where ctest says the libraries are, else build/lib beside this program's build/bin.
std::string LibraryDir() {
    if (const char* dir = getenv("KELMAR_LIB")) return dir;
    return std::filesystem::read_symlink("/proc/self/exe").parent_path().string() + "/../lib";
}

// Whether merely opening the library, before the factory's loader ever ran, made the class known.
bool g_knownBeforeOpen = true, g_knownAfterOpen = false;
// The library calls Tcl through its own stub table, which its entry sets from an interpreter.
int g_entryResult = TCL_ERROR;
struct TclAndOpenFirst : ::testing::Environment {
    void SetUp() override {
        Tcl_FindExecutable(nullptr);
        g_knownBeforeOpen = CitP::Factory::IsRegistered(UtilI::TclPropertyID);
        void* library = dlopen((LibraryDir() + "/libTcltask_Support.so").c_str(), RTLD_NOW);
        g_knownAfterOpen = CitP::Factory::IsRegistered(UtilI::TclPropertyID);
        auto* entry = library ? reinterpret_cast<int (*)(Tcl_Interp*)>(dlsym(library, "Tcltask_support_Init")) : nullptr;
        ASSERT_NE(entry, nullptr) << dlerror();
        Tcl_Interp* interp = Tcl_CreateInterp();
        g_entryResult = entry(interp);
        Tcl_DeleteInterp(interp);
    }
};
const auto* g_env = ::testing::AddGlobalTestEnvironment(new TclAndOpenFirst);

// Collects the detail of every property that ends while it is in scope.
struct DeathLog {
    DeathLog() { CitP::InstanceTable::SetObserver(&Note, this); }
    ~DeathLog() { CitP::InstanceTable::SetObserver(nullptr, nullptr); }
    static void Note(const Port::XUID& classId, const char* detail, void* self) {
        if (classId == UtilI::TclPropertyID) static_cast<DeathLog*>(self)->details.emplace_back(detail ? detail : "<null>");
    }
    std::vector<std::string> details;
};

// A Tcl value of which the test holds one reference.
struct Value {
    explicit Value(const char* text) : obj(Tcl_NewStringObj(text, -1)) { Tcl_IncrRefCount(obj); }
    ~Value() { Tcl_DecrRefCount(obj); }
    Tcl_Obj* obj;
};

class Property : public ::testing::Test {
protected:
    static void SetUpTestSuite() { ASSERT_TRUE(CitP::Factory::LoadLibraryFactory("libTcltask_Support")); }
    static UtilI::MITclProperty Make(Tcl_Obj* value = nullptr) {
        UtilI::MITclProperty p(CitP::Factory::CreateInstanceRef(UtilI::TclPropertyID));
        if (p && value) {
            EXPECT_EQ(p->FromTclObj(value, message), 1);
        }
        return p;
    }
    static Tcl_Obj* Out(UtilI::ITclProperty& p) {
        Tcl_Obj* out = nullptr;
        EXPECT_EQ(p.ToTclObj(out, message), 1);
        return out;
    }
    static inline Port_String message;
};

TEST(PropertyLoad, OpeningTheLibraryRegistersTheClass) {
    EXPECT_FALSE(g_knownBeforeOpen);
    EXPECT_TRUE(g_knownAfterOpen);
    EXPECT_EQ(g_entryResult, TCL_OK);
}

TEST_F(Property, GivesBackTheValueItTook) {
    auto p = Make();
    ASSERT_TRUE(p);
    EXPECT_STREQ(Tcl_GetString(Out(*p)), "");
    EXPECT_EQ(p->GetInterface(CitI::IInterfaceID), p.get());
    EXPECT_NE(p->GetInterface(CommonI::IRefCountID), nullptr);
    for (const char* text : {"(nil)", "nil", "{nil}", "two words", ""}) {
        Value v(text);
        ASSERT_EQ(p->FromTclObj(v.obj, message), 1);
        EXPECT_EQ(Out(*p), v.obj) << "the value itself, not a copy of " << text;
        EXPECT_STREQ(Tcl_GetString(Out(*p)), text);
    }
    EXPECT_EQ(p->FromTclObj(nullptr, message), 0);
    EXPECT_FALSE(message.IsEmpty());
    EXPECT_STREQ(Tcl_GetString(Out(*p)), "") << "a refused value changes nothing";
}

TEST_F(Property, HoldsOneReferenceOfTheCurrentValue) {
    Value first("first"), second("second");
    {
        auto p = Make(first.obj);
        EXPECT_EQ(first.obj->refCount, 2);
        p->FromTclObj(first.obj, message);
        EXPECT_EQ(first.obj->refCount, 2) << "the same value again";
        p->FromTclObj(second.obj, message);
        EXPECT_EQ(first.obj->refCount, 1);
        EXPECT_EQ(second.obj->refCount, 2);
    }
    EXPECT_EQ(second.obj->refCount, 1) << "released with the property";
    auto only = Make(Tcl_NewStringObj("only", -1));
    only->FromTclObj(Out(*only), message);  // its sole reference, handed back to it
    EXPECT_STREQ(Tcl_GetString(Out(*only)), "only");
}

TEST_F(Property, TellsItsValueWhenItEnds) {
    DeathLog log;
    Value nilWord("(nil)");
    {
        auto a = Make(nilWord.obj), b = Make(Tcl_NewStringObj("nil", -1)), untouched = Make();
        EXPECT_EQ(CitP::InstanceTable::Live(UtilI::TclPropertyID), 3);
        b = nullptr;
        auto second = a;
        a = nullptr;
        EXPECT_EQ(log.details, std::vector<std::string>{"nil"}) << "a second reference keeps it";
    }
    EXPECT_EQ(log.details, (std::vector<std::string>{"nil", "(nil)", ""}));
    EXPECT_EQ(CitP::InstanceTable::Live(UtilI::TclPropertyID), 0);
}

}  // namespace
