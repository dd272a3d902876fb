// The scripting support in a real interpreter: object commands and their argument vectors, the
// lifetime of handed-over handles, plain value handles, fetches and stores, identifier variables,
// the wrapper resolver and the support's own GetInterface wrappers.
#include <gtest/gtest.h>
#include <tcl.h>

#include <functional>
#include <string>
#include <vector>

#include "CommonI/RefCountPtr.h"
#include "HdcI/IHDProject.h"
#include "Script/Handle.h"
#include "Script/KelmarPkg.h"
#include "Script/TScriptHandleHelper.h"
#include "Script/TTclWrapFactory.h"
#include "Script/TclWrapFactory.h"
#include "Script/TclWrapSupport.h"
#include "harness.h"

namespace {

using Script::Handle;

inline constexpr Port::XUIDLiteral IProbeID{0x5c0ffee1d2e34b7aull, 0x9e1f00d5a1b2c3d4ull};
// Registered by nobody: the resolver has no factory for it.
inline constexpr Port::XUIDLiteral IUnwrappedID{0x0badc0de12344a5bull, 0x8c6d7e8f90a1b2c3ull};

class IProbe : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IProbeID;
    static constexpr const char* NAME = "IProbe";
};

int g_liveObjects = 0;

// A counted object with the faces IInterface, IProbe and, when asked to, IHDProject.
class ProbeObject final : public IProbe, public HdcI::IHDProject {
public:
    explicit ProbeObject(bool project = false) : m_counter(static_cast<IProbe*>(this)), m_project(project) {
        ++g_liveObjects;
    }
    ~ProbeObject() override { --g_liveObjects; }

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == CommonI::IRefCountID) return &m_counter;
        if (id == CitI::IInterfaceID || id == IProbeID) return static_cast<IProbe*>(this);
        if (m_project && id == HdcI::IHDProjectID) return static_cast<HdcI::IHDProject*>(this);
        return nullptr;
    }
    Port_String GetName() override { return "probe"; }
    Port_String GetFileName() override { return "probe.hd"; }
    long Count() const { return m_counter.Count(); }

private:
    CommonI::RefCounter m_counter;
    bool m_project;
};

// A handle that tells the test what reached it: its argument vectors and its end.
struct Seen {
    struct Arg { Handle* handle; std::string text; bool plainValue; };
    std::vector<std::vector<Arg>> calls;
    std::vector<std::string> events;
};

class RecordingHandle : public Script::PtrHandle<IProbe> {
public:
    RecordingHandle(IProbe* value, Tcl_Interp* interp, Seen& seen, std::string tag)
        : PtrHandle(value, interp), m_seen(seen), m_tag(std::move(tag)) {}
    ~RecordingHandle() override { m_seen.events.push_back("destroy " + m_tag); }

    void ReleaseValue() override { m_seen.events.push_back("release " + m_tag); }
    int Execute(int argc, Handle* const* argv, Tcl_Interp* interp) override {
        std::vector<Seen::Arg> args;
        for (int i = 0; i < argc; ++i) {
            const char* text = argv[i]->GetString();
            const bool plain = dynamic_cast<Script::TclObjHandleBase*>(argv[i]) != nullptr;
            args.push_back({argv[i], text ? text : "<null>", plain});
        }
        m_seen.calls.push_back(std::move(args));
        if (onExecute) return onExecute(interp, argc, argv);
        Tcl_SetObjResult(interp, Tcl_NewIntObj(argc));
        return TCL_OK;
    }

    std::function<int(Tcl_Interp*, int, Handle* const*)> onExecute;

private:
    Seen& m_seen;
    std::string m_tag;
};

class OtherRecordingHandle final : public RecordingHandle {
    using RecordingHandle::RecordingHandle;
};

// The test's wrapper of IProbe, made through the factory table.
class ProbeWrapper final : public Script::PtrHandle<IProbe> {
public:
    ProbeWrapper(IProbe* object, Tcl_Interp* interp) : PtrHandle(object, interp) {
        m_helper.SetHandle(this);
        ProbeWrapper::AddRefValue();
    }
    void AddRefValue() override { Counter()->AddRef(); }
    void ReleaseValue() override { Counter()->Release(); }
    CitI::IInterface* GetScriptHandle(const Port::XUID& id) {
        return id == CitI::IScriptHandleID || id == CitI::IInterfaceID ? &m_helper : nullptr;
    }

private:
    CommonI::IRefCount* Counter() {
        void* value = nullptr;
        GetValue(&value);
        return static_cast<CommonI::IRefCount*>(static_cast<IProbe*>(value)->GetInterface(CommonI::IRefCountID));
    }
    Script::TScriptHandleHelper<ProbeWrapper> m_helper;
};

Script::TTclWrapFactory<ProbeWrapper, IProbe> g_probeFactory;

std::string Text(const Port::XUID& id) { return id.ToString().c_str(); }

class ScriptTest : public ::testing::Test, protected harness::InInterp {
protected:
    static void SetUpTestSuite() {
        Tcl_FindExecutable(nullptr);
        Script::TclWrapFactory::RegisterFactory(IProbeID, &g_probeFactory);
    }
    void SetUp() override {
        interp = Tcl_CreateInterp();
        ASSERT_EQ(Kelmarpkg_Init(interp), TCL_OK);
    }
    void TearDown() override {
        Tcl_DeleteInterp(interp);
        EXPECT_EQ(g_liveObjects, 0);
    }

    // Hands `handle` to Tcl and gives its word.
    static std::string HandOver(Handle* handle) {
        handle->SetResult(interp);
        return Result();
    }
    static bool Starts(const std::string& word, const char* prefix) { return word.rfind(prefix, 0) == 0; }
    static std::vector<std::string> Ended(const std::string& t) { return {"release " + t, "destroy " + t}; }

    Seen seen;
    IProbe* const someValue = reinterpret_cast<IProbe*>(&seen);  // a value only compared, never called
};

TEST_F(ScriptTest, HandOverMakesAKelmarCommandFoundByItsWordUnlessTheHandleIsNoCommand) {
    auto* handle = new RecordingHandle(someValue, interp, seen, "a");
    EXPECT_EQ(handle->GetTclObj(), nullptr);
    const std::string word = HandOver(handle);
    EXPECT_TRUE(Starts(word, "::kelmar::IProbe")) << word;
    EXPECT_EQ(word, handle->GetString());
    ASSERT_EQ(Eval("info commands " + word), TCL_OK);
    EXPECT_EQ(Result(), word);
    handle->SetVariable(interp, "again");
    EXPECT_EQ(Var("again"), word);
    EXPECT_EQ(HandleOf(word), handle);
    EXPECT_EQ(HandleOf("::kelmar::IProbe0"), nullptr);
    EXPECT_TRUE(seen.events.empty());

    // A plain pointer handle, also of no value, gets a word but answers every command with an error.
    auto* plain = new Script::PtrHandle<IProbe>(nullptr, interp);
    void* value = someValue;
    EXPECT_EQ(plain->GetValue(&value), 1);
    const std::string plainWord = HandOver(plain);
    EXPECT_TRUE(Starts(plainWord, "::kelmar::IProbe"));
    EXPECT_EQ(Eval(plainWord + " Anything"), TCL_ERROR);
    EXPECT_NE(Result().find("is no command"), std::string::npos) << Result();
    EXPECT_NE(Result().find(plainWord), std::string::npos) << Result();
}

TEST_F(ScriptTest, ExecuteGetsHandlesAsThemselvesAndOtherWordsAsValues) {
    auto* callee = new RecordingHandle(someValue, interp, seen, "callee");
    auto* other = new OtherRecordingHandle(nullptr, interp, seen, "other");
    const std::string word = HandOver(callee), otherWord = HandOver(other);
    ASSERT_EQ(Eval("set o " + otherWord), TCL_OK);
    ASSERT_EQ(Eval(word + " Do $o plain 42 ::kelmar::IProbe0 {::kelmar::}"), TCL_OK) << Result();
    EXPECT_EQ(Result(), "7");  // Execute's own result and argc
    ASSERT_EQ(seen.calls.size(), 1u);
    const auto& args = seen.calls[0];
    const std::vector<std::string> texts{word, "Do", otherWord, "plain", "42", "::kelmar::IProbe0", "::kelmar::"};
    ASSERT_EQ(args.size(), texts.size());
    for (size_t i = 0; i < args.size(); ++i) {
        EXPECT_EQ(args[i].text, texts[i]) << i;
        EXPECT_EQ(args[i].plainValue, i != 2) << i;
    }
    EXPECT_EQ(args[2].handle, other);

    // A long call leaves the local buffer and keeps the same rules.
    std::string script = word;
    for (int i = 0; i < 20; ++i) script += " w" + std::to_string(i);
    ASSERT_EQ(Eval(script + " $o " + word), TCL_OK);
    EXPECT_EQ(Result(), "23");
    const auto& longArgs = seen.calls[1];
    EXPECT_EQ(longArgs[20].text, "w19");
    EXPECT_TRUE(longArgs[20].plainValue);
    EXPECT_EQ(longArgs[21].handle, other);
    EXPECT_EQ(longArgs[22].handle, callee);

    callee->onExecute = [](Tcl_Interp* in, int, Handle* const*) {
        Tcl_SetResult(in, const_cast<char*>("refused"), TCL_STATIC);
        return TCL_ERROR;
    };
    EXPECT_EQ(Eval(word + " Do"), TCL_ERROR);
    EXPECT_EQ(Result(), "refused");
}

TEST_F(ScriptTest, SameValueAndClassGivesOneWordAndTheNewerHandleEndsAfterTheCommand) {
    auto* first = new RecordingHandle(someValue, interp, seen, "first");
    auto* second = new RecordingHandle(someValue, interp, seen, "second");
    auto* otherClass = new OtherRecordingHandle(someValue, interp, seen, "otherClass");
    const std::string word = HandOver(first);
    EXPECT_EQ(HandOver(first), word);
    EXPECT_EQ(HandOver(second), word);
    EXPECT_EQ(second->GetString(), word);  // still usable by its maker
    const std::string otherWord = HandOver(otherClass);
    EXPECT_NE(otherWord, word);
    EXPECT_TRUE(seen.events.empty());
    ASSERT_EQ(Eval(word + " Do"), TCL_OK);
    EXPECT_EQ(seen.events, Ended("second"));
    EXPECT_EQ(seen.calls.size(), 1u);

    // Inside a command, with another command nested in it, the duplicate lives until the outer one
    // has returned.
    seen.events.clear();
    first->onExecute = [&](Tcl_Interp* in, int, Handle* const*) {
        auto* third = new RecordingHandle(someValue, in, seen, "third");
        third->SetResult(in);
        EXPECT_EQ(Tcl_Eval(in, (otherWord + " Nested").c_str()), TCL_OK);
        EXPECT_TRUE(seen.events.empty());
        EXPECT_EQ(third->GetString(), word);
        Tcl_SetObjResult(in, third->GetTclObj());
        return TCL_OK;
    };
    ASSERT_EQ(Eval(word + " Do"), TCL_OK);
    EXPECT_EQ(Result(), word);
    EXPECT_EQ(seen.events, Ended("third"));
}

TEST_F(ScriptTest, AnotherInterpreterGetsItsOwnCommandAndEndsItWithItself) {
    Tcl_Interp* second = Tcl_CreateInterp();
    ASSERT_EQ(Kelmarpkg_Init(second), TCL_OK);
    const std::string word = HandOver(new RecordingHandle(someValue, interp, seen, "here"));
    auto* there = new RecordingHandle(someValue, second, seen, "there");
    there->SetResult(second);
    const std::string thereWord = Tcl_GetStringResult(second);
    EXPECT_NE(thereWord, word);
    EXPECT_EQ(Tcl_Eval(second, (thereWord + " Do").c_str()), TCL_OK);
    Tcl_DeleteInterp(second);
    EXPECT_EQ(seen.events, Ended("there"));
}

// Renamed to nothing, a handle ends once and is forgotten, though only when the command that
// renamed it has returned; deleted, it takes its command along.
TEST_F(ScriptTest, AHandleEndsWithItsCommandAndItsCommandWithIt) {
    auto* caller = new RecordingHandle(someValue, interp, seen, "caller");
    auto* argument = new OtherRecordingHandle(nullptr, interp, seen, "argument");
    const std::string word = HandOver(caller), argWord = HandOver(argument);
    caller->onExecute = [&](Tcl_Interp* in, int, Handle* const* argv) {
        EXPECT_EQ(Tcl_Eval(in, ("rename " + argWord + " {}").c_str()), TCL_OK);
        EXPECT_TRUE(seen.events.empty());
        EXPECT_EQ(argv[2]->GetString(), argWord);  // still alive
        return TCL_OK;
    };
    ASSERT_EQ(Eval(word + " Do " + argWord), TCL_OK);
    EXPECT_EQ(seen.events, Ended("argument"));
    ASSERT_EQ(Eval("rename " + word + " {}"), TCL_OK);
    EXPECT_EQ(seen.events, (std::vector<std::string>{"release argument", "destroy argument", "release caller",
                                                     "destroy caller"}));
    EXPECT_EQ(HandleOf(word), nullptr);
    seen.events.clear();

    // The value has no word any more: a new handle of it gets a new one.
    auto* handle = new RecordingHandle(someValue, interp, seen, "a");
    const std::string newWord = HandOver(handle);
    EXPECT_NE(newWord, word);
    RecordingHandle copy(*handle);
    EXPECT_EQ(copy.GetTclObj(), nullptr);  // a copy is no command
    void* value = nullptr;
    EXPECT_EQ(copy.GetValue(&value), 0);
    EXPECT_EQ(value, someValue);
    EXPECT_EQ(copy.GetTclInterp(), interp);
    EXPECT_STREQ(copy.GetTypeName(), "IProbe");
    delete handle;
    ASSERT_EQ(Eval("info commands " + newWord), TCL_OK);
    EXPECT_EQ(Result(), "");
    EXPECT_EQ(seen.events, (std::vector<std::string>{"destroy a"}));
}

TEST_F(ScriptTest, PlainValueHandles) {
    Script::TclIntHandle number(42, nullptr);
    Script::TclStringHandle text("some text", interp);
    EXPECT_STREQ(number.GetString(), "42");
    EXPECT_STREQ(text.GetString(), "some text");

    number.SetResult(interp);
    EXPECT_EQ(Result(), "42");
    text.SetVariable(interp, "v");
    EXPECT_EQ(Var("v"), "some text");
    ASSERT_EQ(Eval("array set arr {}"), TCL_OK);
    text.SetVariable(interp, "arr");
    EXPECT_NE(Result().find("variable is array"), std::string::npos) << Result();

    Script::TclObjHandleBase copy(text);
    EXPECT_EQ(copy.GetTclObj(), text.GetTclObj());
    copy = number;
    EXPECT_STREQ(copy.GetString(), "42");

    Handle* fresh = text.NewHandle(interp);
    EXPECT_STREQ(fresh->GetString(), "");
    delete fresh;
    EXPECT_EQ(text.GetSharedHandle(), number.GetSharedHandle());
    EXPECT_STREQ(text.GetSharedHandle()->GetString(), "");
}

// One fetch of a value of type T into `value`, which no row expects, as text.
template <class T>
std::string Fetched(int (*fetch)(T&, Tcl_Interp*, Handle*, int), T value, Tcl_Interp* interp, const char* word,
                    int direction, int& status) {
    Script::TclStringHandle handle(word, interp);
    status = fetch(value, interp, &handle, direction);
    if constexpr (std::is_same_v<T, Port_String>) return value.c_str();
    else if constexpr (std::is_same_v<T, Port::XUID>) return Text(value);
    else return std::to_string(value);
}

// The fetches read the word (IN) or the variable it names (INOUT), and leave Tcl's own message.
TEST_F(ScriptTest, FetchesByDirection) {
    using S = Script::TclWrapSupport;
    ASSERT_EQ(Eval("set s {a text}; set b off; set i -17"), TCL_OK);
    struct Case { const char* word; int direction; char kind; int status; const char* expected; };
    // kind s string, b bool, i int, g identifier; expected: the value, or a piece of the message.
    const Case cases[] = {
        {"hello world", Script::IN, 's', 0, "hello world"},
        {"s", Script::INOUT, 's', 0, "a text"},
        {"nosuch", Script::INOUT, 's', 1, "can't read \"nosuch\": no such variable"},
        {"s", Script::OUT, 's', 1, "OUT"},
        {"s", Script::RESULT, 's', 1, "RESULT"},
        {"yes", Script::IN, 'b', 0, "1"},
        {"b", Script::INOUT, 'b', 0, "0"},
        {"maybe", Script::IN, 'b', 1, "expected boolean value but got \"maybe\""},
        {"s", Script::INOUT, 'b', 1, "expected boolean value but got \"a text\""},
        {"b", Script::OUT, 'b', 1, "OUT"},
        {"2147483647", Script::IN, 'i', 0, "2147483647"},
        {"i", Script::INOUT, 'i', 0, "-17"},
        {"4x", Script::IN, 'i', 1, "expected integer but got \"4x\""},
        {"nosuch", Script::INOUT, 'i', 1, "no such variable"},
        {"i", Script::RESULT, 'i', 1, "RESULT"},
        {"5c0ffee1-d2e3-4b7a-9e1f-00d5a1b2c3d4", Script::IN, 'g', 0, "5c0ffee1-d2e3-4b7a-9e1f-00d5a1b2c3d4"},
        {"no identifier", Script::IN, 'g', 0, "00000000-0000-0000-0000-000000000000"},
    };
    for (const Case& c : cases) {
        SCOPED_TRACE(std::string(1, c.kind) + " " + c.word + " " + std::to_string(c.direction));
        Tcl_ResetResult(interp);
        int status = 1;
        const auto fetch = [&](auto function, auto stale) {
            return Fetched(function, stale, interp, c.word, c.direction, status);
        };
        const std::string got = c.kind == 's'   ? fetch(&S::FetchString, Port_String("stale"))
                                : c.kind == 'b' ? fetch(&S::FetchBool, true)
                                : c.kind == 'i' ? fetch(&S::FetchInt32, int32_t{99})
                                                : fetch(&S::FetchGuid, Port::XUID(IUnwrappedID));
        EXPECT_EQ(status, c.status);
        if (c.status == 0) {
            EXPECT_EQ(got, c.expected);
        } else {
            EXPECT_NE(Result().find(c.expected), std::string::npos) << Result();
        }
    }
    Port_String value;
    EXPECT_EQ(S::FetchString(value, interp, nullptr, Script::IN), 1);
}

TEST_F(ScriptTest, StoresByDirection) {
    using S = Script::TclWrapSupport;
    Script::TclStringHandle target("out", interp), array("arr", interp);
    EXPECT_EQ(S::StoreString("stored", interp, &target, Script::OUT), 0);
    EXPECT_EQ(Var("out"), "stored");
    // The length is the string's own: an embedded nul reaches Tcl.
    EXPECT_EQ(S::StoreString(Port_String("a\0b", 3), interp, nullptr, Script::RESULT), 0);
    int length = 0;
    Tcl_GetStringFromObj(Tcl_GetObjResult(interp), &length);
    EXPECT_EQ(length, 3);

    EXPECT_EQ(S::StoreString("x", interp, nullptr, Script::OUT), 1);
    EXPECT_NE(Result().find("the variable is NULL"), std::string::npos) << Result();
    ASSERT_EQ(Eval("array set arr {}"), TCL_OK);
    EXPECT_EQ(S::StoreString("x", interp, &array, Script::OUT), 1);
    EXPECT_NE(Result().find("can't set \"arr\": variable is array"), std::string::npos) << Result();
    EXPECT_EQ(S::StoreString("x", interp, &target, Script::IN), 1);
    EXPECT_EQ(Var("out"), "stored");

    EXPECT_EQ(S::StoreInt64(int64_t{1} << 40, interp, nullptr, Script::RESULT), 0);
    Tcl_WideInt wide = 0;
    ASSERT_EQ(Tcl_GetWideIntFromObj(nullptr, Tcl_GetObjResult(interp), &wide), TCL_OK);
    EXPECT_EQ(wide, Tcl_WideInt{1} << 40);
}

TEST_F(ScriptTest, CreateVariablesUpToTheTerminator) {
    Script::TclWrapIDEntry table[] = {
        {"::kelmar::Probe", "IProbeID", &Port::BuildXUID<IProbeID>},
        {"deep::er", "IInterfaceID", &Port::BuildXUID<CitI::IInterfaceID>},
        {"", "", nullptr},
        {"::kelmar::Probe", "Behind", &Port::BuildXUID<IProbeID>},
    };
    EXPECT_EQ(Script::TclWrapSupport::CreateVariables(interp, table), 0) << Result();
    EXPECT_EQ(Var("::kelmar::Probe::IProbeID"), Text(IProbeID));
    EXPECT_EQ(Var("::deep::er::IInterfaceID"), Text(CitI::IInterfaceID));
    EXPECT_EQ(Var("::kelmar::Probe::Behind"), "<unset>");

    Script::TclWrapIDEntry bad[] = {
        {"::kelmar::Probe", "arr", &Port::BuildXUID<IProbeID>},
        {"::kelmar::Probe", "fine", &Port::BuildXUID<IProbeID>},
        {"", "", nullptr},
    };
    ASSERT_EQ(Eval("array set ::kelmar::Probe::arr {}"), TCL_OK);
    EXPECT_EQ(Script::TclWrapSupport::CreateVariables(interp, bad), 1);
    EXPECT_NE(Result().find("variable is array"), std::string::npos) << Result();
    EXPECT_EQ(Var("::kelmar::Probe::fine"), Text(IProbeID));
}

TEST_F(ScriptTest, ResolverWithNullWithoutAndWithAFactory) {
    const auto resolve = [&](const Port::XUID& id, CitI::IInterface* object) {
        return Script::TclWrapSupport::TclWrapResolver(id, object, interp);
    };
    EXPECT_EQ(resolve(IProbeID, nullptr), TCL_OK);
    EXPECT_EQ(Result(), "0");
    CommonI::RefCountPtr<IProbe> object(new ProbeObject);
    EXPECT_EQ(resolve(IUnwrappedID, object.get()), TCL_ERROR);
    EXPECT_EQ(Result(), "no wrapper for interface " + Text(IUnwrappedID));

    ASSERT_EQ(resolve(IProbeID, object.get()), TCL_OK);
    const std::string word = Result();
    EXPECT_TRUE(Starts(word, "::kelmar::IProbe"));
    auto* probe = static_cast<ProbeObject*>(object.get());
    EXPECT_EQ(probe->Count(), 2);
    // A second wrapper of the same object shares the word and lets its reference go after the next
    // command.
    ASSERT_EQ(resolve(IProbeID, object.get()), TCL_OK);
    EXPECT_EQ(Result(), word);
    EXPECT_EQ(probe->Count(), 3);
    EXPECT_EQ(Eval(word + " Do"), TCL_ERROR);  // a wrapper without commands of its own
    EXPECT_EQ(probe->Count(), 2);
    ASSERT_EQ(Eval("rename " + word + " {}"), TCL_OK);
    EXPECT_EQ(probe->Count(), 1);
}

TEST_F(ScriptTest, SupportWrappersAnswerGetInterfaceOnly) {
    auto* object = new ProbeObject(true);
    CitI::IInterface* helper =
        Script::TclWrapFactory::CreateInstance(CitI::IInterfaceID, static_cast<IProbe*>(object), interp);
    ASSERT_NE(helper, nullptr);
    EXPECT_EQ(object->Count(), 1);  // the wrapper's reference is the only one
    static_cast<CitI::IScriptHandle*>(helper->GetInterface(CitI::IScriptHandleID))->SetResult(interp);
    const std::string word = Result();
    EXPECT_TRUE(Starts(word, "::kelmar::IInterface")) << word;

    const auto ask = [&](const std::string& from, const Port::XUID& id, const char* extra = "") {
        EXPECT_EQ(Eval(from + " GetInterface " + Text(id) + extra), TCL_OK) << Result();
        return Result();
    };
    const std::string probeWord = ask(word, IProbeID), projectWord = ask(word, HdcI::IHDProjectID);
    EXPECT_TRUE(Starts(probeWord, "::kelmar::IProbe")) << probeWord;
    EXPECT_TRUE(Starts(projectWord, "::kelmar::IHDProject")) << projectWord;
    EXPECT_EQ(ask(word, CitI::IInterfaceID, " ignored"), word);
    EXPECT_EQ(ask(projectWord, IProbeID), probeWord);
    EXPECT_EQ(ask(word, IUnwrappedID), "0");
    EXPECT_EQ(Eval(word + " GetInterface " + Text(CommonI::IRefCountID)), TCL_ERROR);
    EXPECT_EQ(Result(), "no wrapper for interface " + Text(CommonI::IRefCountID));
    EXPECT_EQ(object->Count(), 3);  // one per word: IInterface, IProbe, IHDProject

    for (const std::string& call : {word + " getinterface x", word + " Get", word, word + " GetInterface"}) {
        EXPECT_EQ(Eval(call), TCL_ERROR) << call;
        EXPECT_NE(Result().find("GetInterface"), std::string::npos) << Result();
    }
    ASSERT_EQ(Eval("rename " + probeWord + " {}; rename " + projectWord + " {}"), TCL_OK);
    EXPECT_EQ(object->Count(), 1);
    // TearDown's interpreter deletion ends the last wrapper, and with it the object.
}

}  // namespace
