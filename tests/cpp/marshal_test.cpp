// Fetch and Store by direction, the property result store, and the dispatch paths that no script
// reaches, in a real interpreter with the package and the test kit loaded.
#include <gtest/gtest.h>
#include <tcl.h>

#include <functional>
#include <stdexcept>
#include <string>

#include "CitP/Factory.h"
#include "Dpm/IProjectHelper.h"
#include "HdcI/IHDProject.h"
#include "Script/KelmarPkg.h"
#include "TcltaskI/ISearch.h"
#include "harness.h"
#include "marshal/fetch_store.h"
#include "marshal/property.h"

namespace {

using TcltaskI::Fetch_InterfaceType;
using TcltaskI::Fetch_Type;
using TcltaskI::Store_InterfaceType;
using TcltaskI::Store_Type;

// A counted object of interface I that says when it ends.
template <class I>
class Counted : public I {
public:
    explicit Counted(bool* ended = nullptr) : m_ended(ended) {}
    ~Counted() override {
        if (m_ended) *m_ended = true;
    }
    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == CommonI::IRefCountID) return &m_counter;
        if (id == CitI::IInterfaceID || Answers(id)) return this;
        return nullptr;
    }
    long Count() const { return m_counter.Count(); }

protected:
    virtual bool Answers(const Port::XUID& id) { return id == I::IID; }

private:
    CommonI::RefCounter m_counter{this};
    bool* m_ended;
};

// A property whose conversion to Tcl succeeds with `text`, or fails adding to the message it is given.
class FakeProperty final : public Counted<UtilI::ITclProperty> {
public:
    FakeProperty(const char* text, bool converts, bool* ended = nullptr)
        : Counted(ended), m_text(text), m_converts(converts) {}
    CommonI::RESULT ToTclObj(Tcl_Obj*& out, Port_String& message) override {
        if (!m_converts) {
            message += " and the value is unreadable";
            return 0;
        }
        out = Tcl_NewStringObj(m_text, -1);
        return 1;
    }
    CommonI::RESULT FromTclObj(Tcl_Obj*, Port_String&) override { return 1; }

private:
    const char* m_text;
    bool m_converts;
};

class FakeHDProject final : public Counted<HdcI::IHDProject> {
public:
    Port_String GetName() override { return "hd"; }
    Port_String GetFileName() override { return "hd.prj"; }
};

class FakeHelper final : public Dpm::IProjectHelper {
public:
    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        return id == CitI::IInterfaceID ? this : nullptr;
    }
    Port_String GetName() override { return "helper"; }
};

// A search that throws when asked for a face it does not know.
class ThrowingSearch final : public Counted<TcltaskI::ISearch> {
public:
    CommonI::RESULT search(const Str&, bool, bool, bool, bool, const List&, const List&, Out&, Msg&) override {
        return 1;
    }

protected:
    bool Answers(const Port::XUID& id) override {
        if (id == TcltaskI::ISearchID) return true;
        throw std::runtime_error("no such face");
    }
};

// A word whose text is not to be had.
class TextlessHandle final : public Script::Handle {
public:
    Tcl_Obj* GetTclObj() override { return nullptr; }
    const char* GetString() override { return nullptr; }
    void SetResult(Tcl_Interp*) override {}
    void SetVariable(Tcl_Interp*, const char*) override {}
    Script::Handle* NewHandle(Tcl_Interp*) override { return nullptr; }
    Script::Handle* GetSharedHandle() override { return nullptr; }
};

class Marshal : public ::testing::Test, protected harness::InInterp {
protected:
    static void SetUpTestSuite() {
        Tcl_FindExecutable(nullptr);
        interp = Tcl_CreateInterp();
        Kelmarpkg_Init(interp);
        const std::string dir = harness::LibraryDir();
        ASSERT_EQ(Eval("load " + dir + "/libTcltaskI_Morvane.so Tcltaski_morvane"), TCL_OK) << Result();
        ASSERT_EQ(Eval("load " + dir + "/libTcltaskI_TestKit.so Tcltaski_testkit"), TCL_OK) << Result();
        ASSERT_TRUE(CitP::Factory::LoadLibraryFactory("libTcltask_Support"));
    }
    static void TearDownTestSuite() { Tcl_DeleteInterp(interp); }

    // Starts errorInfo with a text of its own, so that a report without reset shows behind it.
    void SetUp() override {
        Tcl_ResetResult(interp);
        Tcl_AddErrorInfo(interp, "earlier|");
        Tcl_SetObjResult(interp, Tcl_NewStringObj("held", -1));
    }

    static std::string ErrorInfo() {
        Tcl_Obj* options = Tcl_GetReturnOptions(interp, TCL_ERROR);
        Tcl_IncrRefCount(options);
        Tcl_Obj* key = Tcl_NewStringObj("-errorinfo", -1);
        Tcl_IncrRefCount(key);
        Tcl_Obj* info = nullptr;
        Tcl_DictObjGet(nullptr, options, key, &info);
        std::string text = info ? Tcl_GetString(info) : "";
        Tcl_DecrRefCount(key);
        Tcl_DecrRefCount(options);
        return text;
    }
    // The result of a report without reset: the text in the result, behind the earlier errorInfo.
    static void ExpectReportWithoutReset(int status, const std::string& text) {
        EXPECT_EQ(status, 1);
        EXPECT_EQ(Result(), text);
        EXPECT_EQ(ErrorInfo(), "earlier|" + text);
    }
    static std::string Made(const std::string& script) {
        EXPECT_EQ(Eval(script), TCL_OK) << Result();
        return Result();
    }
    // Deletes the object commands of the words.
    static void Forget(const std::string& words) {
        EXPECT_EQ(Eval("foreach w {" + words + "} { rename $w {} }"), TCL_OK) << Result();
    }
};

using Word = Script::TclStringHandle;

// Directions that no command uses, and a word that is no object: each is a report without reset, and
// drops no reference.
TEST_F(Marshal, FetchesRefuseOutAndResultStoresRefuseInAndAnOutWithoutVariable) {
    Word word("0", interp), junk("junk", interp);
    Dpm::IProjectHelper* helper = nullptr;
    FakeHelper fake;
    CitI::MIInterface component;
    UtilI::MITclProperty property;
    HdcI::MIHDProject project(new FakeHDProject), none;
    const std::pair<std::function<int()>, const char*> cases[] = {
        {[&] { return Fetch_Type(helper, interp, &word, Script::OUT); },
         "Tetch_Type was called for an OUT parameter, which indicates a failure."},
        {[&] { return Fetch_Type(helper, interp, nullptr, Script::RESULT); },
         "Fetch_Type was called for a RESULT, which indicates a failure."},
        {[&] { return Fetch_InterfaceType(component, interp, &word, Script::OUT); },
         "Fetch_InterfaceType was called for an OUT parameter, which indicates a failure."},
        {[&] { return Fetch_InterfaceType(component, interp, nullptr, Script::RESULT); },
         "Fetch_InterfaceType was called for a RESULT, which indicates a failure"},
        {[&] { return Fetch_InterfaceType(component, interp, &junk, Script::IN); },
         "Unable to fetch an object of Interface type from parameter"},
        {[&] { return Fetch_InterfaceType(property, interp, &word, Script::OUT); },
         "Fetch_InterfaceType<UtilI::ITclProperty> was called for an OUT parameter, which indicates a failure."},
        {[&] { return Fetch_InterfaceType(property, interp, nullptr, Script::RESULT); },
         "Fetch_InterfaceType was called for a RESULT, which indicates a failure"},
        {[&] { return Store_Type<Dpm::IProjectHelper>(&fake, interp, nullptr, Script::IN); },
         "Store_Type was called for an IN parameter, which  indicates a failure."},
        {[&] { return Store_Type<Dpm::IProjectHelper>(&fake, interp, nullptr, Script::OUT); },
         "Store_Type was called for an OUT parameter, but the variable is NULL"},
        {[&] { return Store_Type<Dpm::IProjectHelper>(nullptr, interp, nullptr, Script::OUT); },
         "Store_Type was called for an OUT parameter, but the variable is NULL"},
        {[&] { return Store_InterfaceType(project, interp, nullptr, Script::IN); },
         "Store_InterfaceType was called for an IN parameter, which  indicates a failure."},
        {[&] { return Store_InterfaceType(project, interp, nullptr, Script::OUT); },
         "Store_InterfaceType was called for an OUT parameter, but the variable is NULL"},
        {[&] { return Store_InterfaceType(none, interp, nullptr, Script::OUT); },
         "Store_InterfaceType was called for an OUT parameter, but the variable is NULL"},
    };
    for (const auto& [run, text] : cases) {
        SCOPED_TRACE(text);
        SetUp();
        ExpectReportWithoutReset(run(), text);
    }
    EXPECT_FALSE(component);
    EXPECT_FALSE(property);
    EXPECT_EQ(static_cast<FakeHDProject*>(project.get())->Count(), 1);
}

// Objects in and out ------------------------------------------------------------------------------

TEST_F(Marshal, ObjectsGoOutAsWrappersAndComeBack) {
    bool ended = false;
    auto* raw = new FakeHDProject;
    auto* other = new FakeHDProject;
    HdcI::MIHDProject project(raw), result(other);
    Word name("hdOut", nullptr);
    ASSERT_EQ(Store_InterfaceType(project, interp, &name, Script::OUT), 0);
    const std::string word = Var("hdOut");
    ASSERT_EQ(Store_InterfaceType(result, interp, nullptr, Script::RESULT), 0);
    const std::string resultWord = Result();
    // Each wrapper holds a reference of its own.
    EXPECT_EQ(raw->Count(), 2);
    EXPECT_EQ(other->Count(), 2);
    EXPECT_NE(word, resultWord);

    // No factory makes a wrapper of a property.
    UtilI::MITclProperty property(new FakeProperty("v", true, &ended));
    SetUp();
    ExpectReportWithoutReset(Store_InterfaceType(property, interp, nullptr, Script::RESULT),
                             "Store_InterfaceType was called for a type that does not exist in Script::TclWrapFactory");
    property = nullptr;
    EXPECT_TRUE(ended);

    // A helper goes out as a handle of its own type and comes back as the same pointer.
    FakeHelper helper;
    ASSERT_EQ(Store_Type<Dpm::IProjectHelper>(&helper, interp, nullptr, Script::RESULT), 0);
    const std::string helperWord = Result();
    Word back(helperWord.c_str(), interp);
    Dpm::IProjectHelper* fetched = nullptr;
    EXPECT_EQ(Fetch_Type(fetched, interp, HandleOf(helperWord), Script::IN), 0);
    EXPECT_EQ(fetched, &helper);
    // The bare word is no handle: only the support's handle behind it carries the pointer.
    SetUp();
    ExpectReportWithoutReset(Fetch_Type(fetched, interp, &back, Script::IN), "Unable to fetch an object from parameter");

    Forget(word + " " + resultWord + " " + helperWord);
    EXPECT_EQ(raw->Count(), 1);
    EXPECT_EQ(other->Count(), 1);
}

TEST_F(Marshal, ComponentsComeInCountedFromHandlesAndVariablesAndZeroIsNull) {
    const std::string word = Made("testkit::component fetched");
    Script::Handle* handle = HandleOf(word);
    ASSERT_NE(handle, nullptr);
    CitI::MIInterface component;
    ASSERT_EQ(Fetch_InterfaceType(component, interp, handle, Script::IN), 0);
    ASSERT_TRUE(component);

    // INOUT: a variable that holds no handle, or none at all, is a null component and no failure.
    Eval("set holder " + word + "; set plain text");
    for (const char* variable : {"holder", "plain", "nosuch"}) {
        Word name(variable, interp);
        CitI::MIInterface fromVariable(component);
        EXPECT_EQ(Fetch_InterfaceType(fromVariable, interp, &name, Script::INOUT), 0) << variable;
        EXPECT_EQ(fromVariable.get(), std::string(variable) == "holder" ? component.get() : nullptr) << variable;
    }
    component = nullptr;
    Forget(word);

    // By value: 0, NULL and 0x0 are null; another word is refused in the first test. (Null objects
    // through the project commands are pinned by the scripts' tests.)
    for (const char* text : {"0", "NULL", "0x0"}) {
        Word zero(text, interp);
        CitI::MIInterface held(new Counted<CitI::IInterface>);
        EXPECT_EQ(Fetch_InterfaceType(held, interp, &zero, Script::IN), 0) << text;
        EXPECT_FALSE(held) << text;
    }
}

// Properties --------------------------------------------------------------------------------------

std::string TextOf(const UtilI::MITclProperty& property) {
    Tcl_Obj* value = nullptr;
    Port_String message;
    if (!property || property->ToTclObj(value, message) != 1) return "<none>";
    Tcl_IncrRefCount(value);
    std::string text = Tcl_GetString(value);
    Tcl_DecrRefCount(value);
    return text;
}

TEST_F(Marshal, PropertiesAreMadeFromTheWordOrTheVariable) {
    bool ended = false;
    UtilI::MITclProperty property(new FakeProperty("old", true, &ended));
    Word word("a {b c}", interp);
    ASSERT_EQ(Fetch_InterfaceType(property, interp, &word, Script::IN), 0);
    EXPECT_TRUE(ended);  // the reference held before is given back
    EXPECT_EQ(TextOf(property), "a {b c}");

    Eval("set propertyVariable {from the variable}");
    Word name("propertyVariable", interp);
    UtilI::MITclProperty fromVariable;
    ASSERT_EQ(Fetch_InterfaceType(fromVariable, interp, &name, Script::INOUT), 0);
    EXPECT_EQ(TextOf(fromVariable), "from the variable");
    EXPECT_NE(fromVariable.get(), property.get());

    // No variable: a null property and success, with Tcl's message left in the result.
    Word missing("noPropertyVariable", interp);
    EXPECT_EQ(Fetch_InterfaceType(fromVariable, interp, &missing, Script::INOUT), 0);
    EXPECT_FALSE(fromVariable);
    EXPECT_EQ(Result(), "can't read \"noPropertyVariable\": no such variable");
}

// A fetch of an argument word without a property component is pinned by the scripts' tests; the
// fetch from a variable is not reached by any command.
TEST_F(Marshal, NoPropertyComponentIsTheCreationFailure) {
    CitP::Factory::SetCreateFilter([](const Port::XUID& id) { return !(id == UtilI::TclPropertyID); });
    Eval("set propertyVariable value");
    Word name("propertyVariable", interp);
    UtilI::MITclProperty property;
    SetUp();
    ExpectReportWithoutReset(Fetch_InterfaceType(property, interp, &name, Script::INOUT),
                             "Unable to create an comopoent that implements UtilI::ITclProperty interface");
    CitP::Factory::SetCreateFilter(nullptr);
}

// A failed conversion of the out property is a successful command whose result tells it, with the
// message the operation left, and nothing in errorInfo. (The value and the null result are pinned
// by the scripts' tests.)
TEST_F(Marshal, ResultStoreOfAPropertyThatDoesNotConvert) {
    Port_String message("op said");
    EXPECT_EQ(TcltaskI::StoreResultProperty(UtilI::MITclProperty(new FakeProperty("", false)), message, interp),
              TCL_OK);
    EXPECT_EQ(Result(), "ERROR occurred when converting UtilI::ITclProperty interface object to Tcl_Obj: "
                        "op said and the value is unreadable");
    EXPECT_EQ(ErrorInfo(), "earlier|");
}

// Dispatch paths that no script reaches -----------------------------------------------------------

// An unknown word resets, so that what errorInfo held before is gone; too few words and a
// GetInterface without an object are reports without reset.
TEST_F(Marshal, AWordWithoutTextIsNULLAndTheCountAndGetInterfaceFailuresDoNotReset) {
    const std::string word = Made("testkit::new ISearch"), orphan = Made("testkit::orphan ISearch");
    TextlessHandle textless;
    Word self(word.c_str(), interp), search("search", interp), getInterface("GetInterface", interp),
        id(Tcl_GetVar(interp, "::kelmar::TcltaskI::ISearchID", TCL_GLOBAL_ONLY), interp);
    Script::Handle* noText[] = {&self, &textless};
    SetUp();
    EXPECT_EQ(HandleOf(word)->Execute(2, noText, interp), 1);
    EXPECT_EQ(Result(), "Unknown command NULL for TcltaskI::TclWrapISearch\n"
                        "  Valid commands for this object are:\n    search\n    GetInterface\n");
    EXPECT_EQ(ErrorInfo().rfind(Result(), 0), 0u);

    Script::Handle* tooFew[] = {&self, &search};
    SetUp();
    ExpectReportWithoutReset(HandleOf(word)->Execute(2, tooFew, interp),
                             "Wrong number of arguments: '" + word.substr(10) + " search'\nPlease type 'help " +
                                 word.substr(10) + " search' to get more information");
    Script::Handle* noObject[] = {&self, &getInterface, &id};
    SetUp();
    ExpectReportWithoutReset(HandleOf(orphan)->Execute(3, noObject, interp),
                             "Failed to get TcltaskI::ISearch in TcltaskI::TclWrapISearch::GetInterface.");
    Forget(word + " " + orphan);
}

TEST_F(Marshal, GetInterfaceCatchesAnException) {
    auto* search = new ThrowingSearch;
    CitI::MIInterface owner(static_cast<TcltaskI::ISearch*>(search));
    CitI::IInterface* made = Script::TclWrapFactory::CreateInstance(TcltaskI::ISearchID, owner.get(), interp);
    ASSERT_NE(made, nullptr);
    auto* script = static_cast<CitI::IScriptHandle*>(made->GetInterface(CitI::IScriptHandleID));
    ASSERT_NE(script, nullptr);
    script->SetResult(interp);
    const std::string word = Result();
    owner = nullptr;  // the wrapper holds the object from here on

    SetUp();
    EXPECT_EQ(Eval(word + " GetInterface 11111111-2222-3333-4444-555555555555"), TCL_ERROR);
    EXPECT_EQ(Result(), "An exception took place while calling TcltaskI::TclWrapISearch::GetInterface.");
    EXPECT_EQ(Eval(word + " GetInterface $::kelmar::TcltaskI::ISearchID"), TCL_OK) << Result();
    EXPECT_EQ(Result(), word);
    EXPECT_EQ(search->Count(), 1);
    Forget(word);
}

TEST_F(Marshal, AnOutObjectWithoutVariableEndsTheMethodBeforeTheString) {
    const std::string manager =
        Made("testkit::new ITclProjectMgr -handler {apply {{op args} {return {object new message said code 5}}}}");
    Word self(manager.c_str(), interp), message("messageOut", nullptr);
    Eval("unset -nocomplain messageOut");
    for (const char* command : {"GetCurrentTclProject", "GetCurrentHDProject", "GetCurrentProjectHelper"}) {
        Word word(command, interp);
        Script::Handle* argv[] = {&self, &word, nullptr, &message};
        EXPECT_EQ(HandleOf(manager)->Execute(4, argv, interp), 1) << command;
        EXPECT_EQ(Result(), std::string(command) == "GetCurrentProjectHelper"
                                ? "Store_Type was called for an OUT parameter, but the variable is NULL"
                                : "Store_InterfaceType was called for an OUT parameter, but the variable is NULL")
            << command;
        EXPECT_EQ(Var("messageOut"), "<unset>") << command;
    }
    EXPECT_EQ(Made("testkit::calls " + manager), "GetCurrentTclProject GetCurrentHDProject GetCurrentProjectHelper");
    Forget(manager);
}

}  // namespace
