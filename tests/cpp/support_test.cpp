// The property component, made through the factory, with real Tcl values.
#include <gtest/gtest.h>
#include <tcl.h>

#include <string>
#include <vector>

#include "CitP/Factory.h"
#include "CitP/InstanceTable.h"
#include "UtilI/ITclProperty.h"
#include "harness.h"

namespace {

const harness::OpenFirst* const g_opened = harness::OpenFirst::Add("libTcltask_Support", {UtilI::TclPropertyID});

// The library calls Tcl through its own stub table, which its entry sets from an interpreter; the
// entry runs once the library is open.
int g_entryResult = TCL_ERROR;
struct RunEntry : ::testing::Environment {
    void SetUp() override {
        Tcl_FindExecutable(nullptr);
        void* library = dlopen((harness::LibraryDir() + "/libTcltask_Support.so").c_str(), RTLD_NOW);
        auto* entry = library ? reinterpret_cast<int (*)(Tcl_Interp*)>(dlsym(library, "Tcltask_support_Init")) : nullptr;
        ASSERT_NE(entry, nullptr) << dlerror();
        Tcl_Interp* interp = Tcl_CreateInterp();
        g_entryResult = entry(interp);
        Tcl_DeleteInterp(interp);
    }
};
const auto* g_entry = ::testing::AddGlobalTestEnvironment(new RunEntry);

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
    static void SetUpTestSuite() {
        Tcl_FindExecutable(nullptr);
        ASSERT_TRUE(CitP::Factory::LoadLibraryFactory("libTcltask_Support"));
    }
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

TEST(PropertyLoad, OpeningTheLibraryRegistersTheClassAndItsEntryRuns) {
    g_opened->ExpectOpeningRegistered();
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
