// The handle classes of the scripting support (libKelmarPkg). A handle stands for a value in Tcl:
// a plain Tcl value, or a pointer to an object whose word is an object command in ::kelmar.
#pragma once

#include <tcl.h>

#include <typeinfo>

#include "CitI/IInterface.h"
#include "CommonI/IRefCount.h"

namespace Script {

// The direction of a parameter of a Fetch or Store.
enum TclWrapParamType : int { IN = 0, OUT = 1, INOUT = 2, RESULT = 3 };

class Handle {
public:
    Handle() = default;
    Handle(const Handle&) = default;
    Handle& operator=(const Handle&) = default;

    // Take and give back the handle's reference on what it stands for; called by the support.
    virtual void AddRefValue();
    virtual void ReleaseValue();
    virtual ~Handle();
    // Runs the handle as a command: argv[0] is the object's word, argv[1] the command word.
    // A handle that is no command answers with an error.
    virtual int Execute(int argc, Handle* const* argv, Tcl_Interp* interp);
    virtual Tcl_Obj* GetTclObj() = 0;
    virtual const char* GetString() = 0;
    virtual void SetResult(Tcl_Interp* interp) = 0;
    virtual void SetVariable(Tcl_Interp* interp, const char* name) = 0;
    virtual Handle* NewHandle(Tcl_Interp* interp) = 0;
    virtual Handle* GetSharedHandle() = 0;
};

// A handle that holds an untyped pointer and an interpreter. Handing it to Tcl (SetResult or
// SetVariable) makes its word an object command "::kelmar::<Type><n>" and gives the handle to the
// support, which ends it (ReleaseValue, then the destructor) when the command is deleted. Handing the
// same pointer under the same handle class to Tcl again gives the word it already has; the newer
// handle is then ended by the support once the running command is over.
class PtrHandleBase : public Handle {
public:
    PtrHandleBase();
    explicit PtrHandleBase(Tcl_Interp* interp);
    PtrHandleBase(void* value, Tcl_Interp* interp);
    PtrHandleBase(const PtrHandleBase& other);
    PtrHandleBase& operator=(const PtrHandleBase& other);
    ~PtrHandleBase() override;

    // 0 and the pointer given at construction; 1 when there is none.
    int GetValue(void** out) const;
    Tcl_Interp* GetTclInterp() const { return m_interp; }

    // The handle whose word is the text of `obj`, or null.
    static PtrHandleBase* GetHandleFromTclObj(Tcl_Obj* obj);

    Tcl_Obj* GetTclObj() override;
    const char* GetString() override;
    void SetResult(Tcl_Interp* interp) override;
    void SetVariable(Tcl_Interp* interp, const char* name) override;

    // The type part of the word ("ICollection" for ::kelmar::ICollection7).
    const char* GetTypeName() const { return m_typeName; }

protected:
    void SetTypeName(const char* name) { m_typeName = name; }
    // The class whose words this handle shares: one word per value and class. A handle that differs
    // from its base only in how it holds the value answers for the base.
    void SetIdentity(const std::type_info& type) { m_identity = &type; }

private:
    friend class HandleRegistry;

    void* m_value;
    Tcl_Interp* m_interp;
    const char* m_typeName;
    const std::type_info* m_identity = nullptr;  // null: the handle's own class
    Tcl_Obj* m_word;                             // the word once handed to Tcl, else null
};

// A handle of an object of type T. It adds no data.
template <class T>
class PtrHandle : public PtrHandleBase {
public:
    PtrHandle() { SetTypeName(T::NAME); }
    explicit PtrHandle(Tcl_Interp* interp) : PtrHandleBase(interp) { SetTypeName(T::NAME); }
    PtrHandle(T* value, Tcl_Interp* interp) : PtrHandleBase(value, interp) { SetTypeName(T::NAME); }
    PtrHandle(const PtrHandle& other) : PtrHandleBase(other) {}
    PtrHandle& operator=(const PtrHandle& other) {
        PtrHandleBase::operator=(other);
        return *this;
    }

    Handle* NewHandle(Tcl_Interp* interp) override { return new PtrHandle<T>(interp); }
    // The one empty PtrHandle<T>, made on first use for this handle's interpreter; never freed. The
    // initialisation of a local static is safe when two threads get here at once.
    Handle* GetSharedHandle() override {
        static PtrHandle<T>* const shared = new PtrHandle<T>(GetTclInterp());
        return shared;
    }
};

// The counter of the object of type T that `handle` holds; null when it holds none or the object is
// not counted. Every handle that counts its object counts through this.
template <class T>
CommonI::IRefCount* CounterOf(const PtrHandleBase& handle) {
    void* value = nullptr;
    if (handle.GetValue(&value) != 0 || value == nullptr) return nullptr;
    return static_cast<CommonI::IRefCount*>(static_cast<T*>(value)->GetInterface(CommonI::IRefCountID));
}

// A handle of a plain pointer to an object that may be counted: while the support keeps the handle,
// it holds a reference on the object when the object answers CommonI::IRefCount, so that a word a
// script keeps never outlives what it stands for. It is still a PtrHandle<T> to every fetch.
template <class T>
class CountedPtrHandle : public PtrHandle<T> {
public:
    CountedPtrHandle(T* value, Tcl_Interp* interp) : PtrHandle<T>(value, interp) {
        this->SetIdentity(typeid(PtrHandle<T>));
        CountedPtrHandle::AddRefValue();
    }
    CountedPtrHandle(const CountedPtrHandle&) = delete;
    CountedPtrHandle& operator=(const CountedPtrHandle&) = delete;
    // The reference goes back through ReleaseValue, called by whoever ends the handle.
    ~CountedPtrHandle() override = default;

    void AddRefValue() override {
        if (CommonI::IRefCount* counter = CounterOf<T>(*this)) counter->AddRef();
    }
    void ReleaseValue() override {
        if (CommonI::IRefCount* counter = CounterOf<T>(*this)) counter->Release();
    }
};

// A handle of a plain Tcl value. SetResult and SetVariable copy the value; the caller destroys the
// handle.
class TclObjHandleBase : public Handle {
public:
    // Holds `obj` with a reference of its own.
    explicit TclObjHandleBase(Tcl_Obj* obj);
    TclObjHandleBase(const TclObjHandleBase& other);
    TclObjHandleBase& operator=(const TclObjHandleBase& other);
    ~TclObjHandleBase() override;

    Tcl_Obj* GetTclObj() override { return m_obj; }
    const char* GetString() override;
    void SetResult(Tcl_Interp* interp) override;
    void SetVariable(Tcl_Interp* interp, const char* name) override;
    Handle* NewHandle(Tcl_Interp* interp) override;
    Handle* GetSharedHandle() override;

protected:
    TclObjHandleBase();  // for a value set by the derived class with SetObj
    void SetObj(Tcl_Obj* obj);

private:
    Tcl_Obj* m_obj;
};

class TclIntHandle : public TclObjHandleBase {
public:
    TclIntHandle(int value, Tcl_Interp* interp);
};

class TclStringHandle : public TclObjHandleBase {
public:
    TclStringHandle(const char* text, Tcl_Interp* interp);
};

}  // namespace Script
