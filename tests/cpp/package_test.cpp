// Counted pointers, the wrapper's helper, the wrapper factory and the wrapper's own handle steps.
#include <gtest/gtest.h>
#include <tcl.h>

#include <vector>

#include "Script/KelmarPkg.h"
#include "Script/TTclWrapFactory.h"
#include "wrappers/classes.h"

namespace {

using CommonI::RefCountPtr;

// A counted object that logs its counting, and answers one task interface: the search, whose one
// operation is all there is to stub.
class Counted final : public TcltaskI::ISearch {
public:
    explicit Counted(std::vector<std::string>* log) : m_log(log) {}
    ~Counted() override { m_log->push_back("destroyed"); }

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == CommonI::IRefCountID) return &m_counter;
        if (id == TcltaskI::ISearchID || id == CitI::IInterfaceID) return this;
        return nullptr;
    }
    long Count() const { return m_counter.Count(); }

    CommonI::RESULT search(const Str&, bool, bool, bool, bool, const List&, const List&, Out&, Msg&) override {
        return 1;
    }

private:
    // Logs every step so that the order of adding and dropping can be checked.
    class LoggingCounter final : public CommonI::IRefCount {
    public:
        explicit LoggingCounter(Counted* owner) : m_owner(owner) {}
        CitI::IInterface* GetInterface(const Port::XUID& id) override { return m_owner->GetInterface(id); }
        long AddRef() override {
            m_owner->m_log->push_back("add");
            return ++m_count;
        }
        long Release() override {
            m_owner->m_log->push_back("drop");
            const long left = --m_count;
            if (left == 0) delete m_owner;
            return left;
        }
        long Count() const { return m_count; }

    private:
        Counted* m_owner;
        long m_count = 0;
    };

    std::vector<std::string>* m_log;
    LoggingCounter m_counter{this};
};

TEST(RefCountPtr, CountsThroughTheCounterItAsksFor) {
    std::vector<std::string> log;
    auto* object = new Counted(&log);
    {
        RefCountPtr<TcltaskI::ISearch> first(object);
        EXPECT_EQ(object->Count(), 1);
        RefCountPtr<TcltaskI::ISearch> uncounted(object, false);
        EXPECT_EQ(object->Count(), 1);
        uncounted.Detach();
        RefCountPtr<TcltaskI::ISearch> copy(first);
        EXPECT_EQ(object->Count(), 2);
        // From another interface: the source is asked for the target's identifier and keeps its own.
        RefCountPtr<CitI::IInterface> root(first);
        EXPECT_EQ(root.get(), static_cast<CitI::IInterface*>(object));
        EXPECT_EQ(object->Count(), 3);
        RefCountPtr<UtilI::ITclProperty> other(root);  // the object has no such interface
        EXPECT_FALSE(other);
    }
    EXPECT_EQ(log.back(), "destroyed");
}

TEST(RefCountPtr, AssignmentAddsBeforeItDrops) {
    std::vector<std::string> log;
    auto* object = new Counted(&log);
    RefCountPtr<TcltaskI::ISearch> only(object);
    // Assigning the one reference to itself must not end the object on the way.
    RefCountPtr<TcltaskI::ISearch>& alias = only;
    only = alias;
    EXPECT_EQ(object->Count(), 1);
    EXPECT_EQ(log, (std::vector<std::string>{"add", "add", "drop"}));

    RefCountPtr<TcltaskI::ISearch> empty;
    only = empty;
    EXPECT_EQ(log.back(), "destroyed");
}

TEST(RefCountPtr, AttachTakesNoReferenceAndNullCountsNothing) {
    std::vector<std::string> log;
    auto* object = new Counted(&log);
    RefCountPtr<TcltaskI::ISearch> held(object);
    RefCountPtr<TcltaskI::ISearch> attached;
    attached.Attach(object);
    EXPECT_EQ(object->Count(), 1);
    attached.Detach();
    RefCountPtr<TcltaskI::ISearch> null(nullptr);
    RefCountPtr<CitI::IInterface> stillNull(null);
    EXPECT_FALSE(stillNull);
}

class WrapperTest : public ::testing::Test {
protected:
    void SetUp() override {
        Tcl_FindExecutable(nullptr);
        interp = Tcl_CreateInterp();
        // The package's objects call Tcl through the stub table, here this program's copy of it.
        ASSERT_NE((Tcl_InitStubs)(interp, "8.6", 0), nullptr);
        Kelmarpkg_Init(interp);
    }
    void TearDown() override { Tcl_DeleteInterp(interp); }
    Tcl_Interp* interp = nullptr;
};

TEST_F(WrapperTest, HelperNeverCounts) {
    Script::TScriptHandleHelper<TcltaskI::TclWrapISearch> helper;
    EXPECT_EQ(helper.GetInterface(CommonI::IRefCountID), nullptr);
    EXPECT_EQ(helper.GetInterface(CitI::IScriptHandleID), &helper);
    EXPECT_FALSE(helper.SetResult(interp));
    EXPECT_FALSE(helper.SetVariable(interp, "x"));
    { CitI::MIInterface counted(&helper); }  // nothing to add or drop: the helper survives
    EXPECT_EQ(helper.GetHandle(), nullptr);
}

TEST_F(WrapperTest, FactoryMakesAWrapperHoldingOneReference) {
    std::vector<std::string> log;
    auto* object = new Counted(&log);
    RefCountPtr<TcltaskI::ISearch> owner(object);
    Script::TTclWrapFactory<TcltaskI::TclWrapISearch, TcltaskI::ISearch> factory;
    EXPECT_EQ(factory.GetInterface(CitI::ITclWrapFactoryID), &factory);
    EXPECT_EQ(factory.CreateInstance(TcltaskI::IGlobalID, object, interp), nullptr);
    EXPECT_EQ(factory.CreateInstance(TcltaskI::ISearchID, nullptr, interp), nullptr);
    EXPECT_EQ(object->Count(), 1);

    CitI::IInterface* helper = factory.CreateInstance(TcltaskI::ISearchID, object, interp);
    ASSERT_NE(helper, nullptr);
    auto* script = static_cast<CitI::IScriptHandle*>(helper->GetInterface(CitI::IScriptHandleID));
    ASSERT_EQ(script, helper);
    auto* wrapper = dynamic_cast<TcltaskI::TclWrapISearch*>(script->GetHandle());
    ASSERT_NE(wrapper, nullptr);
    EXPECT_EQ(object->Count(), 2);
    EXPECT_EQ(helper->GetInterface(CommonI::IRefCountID), nullptr);

    // A plain handle of the type, not a wrapper; the shared handle is one object for any interpreter.
    Script::Handle* plain = wrapper->NewHandle(interp);
    EXPECT_EQ(dynamic_cast<TcltaskI::TclWrapISearch*>(plain), nullptr);
    EXPECT_NE(dynamic_cast<Script::PtrHandle<TcltaskI::ISearch>*>(plain), nullptr);
    delete plain;
    Tcl_Interp* other = Tcl_CreateInterp();
    EXPECT_EQ(wrapper->GetSharedHandle(), wrapper->GetSharedHandle());
    TcltaskI::TclWrapISearch second(object, other);
    EXPECT_EQ(second.GetSharedHandle(), wrapper->GetSharedHandle());
    second.ReleaseValue();

    // A copy takes a reference of its own; the destructor gives none back.
    {
        TcltaskI::TclWrapISearch copy(*wrapper);
        EXPECT_EQ(object->Count(), 3);
        copy.ReleaseValue();
    }
    EXPECT_EQ(object->Count(), 2);
    wrapper->ReleaseValue();
    delete wrapper;
    EXPECT_EQ(object->Count(), 1);
    Tcl_DeleteInterp(other);
}

TEST_F(WrapperTest, WrapperWithoutObjectCountsNothing) {
    TcltaskI::TclWrapISearch orphan(nullptr, interp);
    void* value = &orphan;
    EXPECT_EQ(orphan.GetValue(&value), 1);
    orphan.AddRefValue();
    orphan.ReleaseValue();
    EXPECT_EQ(orphan.GetScriptHandle(CitI::IInterfaceID), orphan.GetScriptHandle(CitI::IScriptHandleID));
    EXPECT_EQ(orphan.GetScriptHandle(TcltaskI::ISearchID), nullptr);
}

}  // namespace
