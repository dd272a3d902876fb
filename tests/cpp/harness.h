// What the C++ tests share: where the built libraries are, whether opening a component library
// alone registers its classes, and the words, variables and handles of a test's interpreter.
#pragma once

#include <dlfcn.h>
#include <gtest/gtest.h>
#include <tcl.h>

#include <algorithm>
#include <filesystem>
#include <string>
#include <vector>

#include "CitP/Factory.h"
#include "Script/Handle.h"

namespace harness {

// Where ctest says the libraries are, else build/lib beside this program's build/bin.
inline std::string LibraryDir() {
    if (const char* dir = getenv("KELMAR_LIB")) return dir;
    return std::filesystem::read_symlink("/proc/self/exe").parent_path().string() + "/../lib";
}

// Opens a component library before any test runs, and counts its classes the factory knew before
// and after: opening it, before the factory's loader ever ran, must register all of them.
class OpenFirst : public ::testing::Environment {
public:
    static OpenFirst* Add(std::string library, std::vector<Port::XUID> classes) {
        return static_cast<OpenFirst*>(::testing::AddGlobalTestEnvironment(new OpenFirst(library, classes)));
    }
    void SetUp() override {
        m_knownBefore = Known();
        dlopen((LibraryDir() + "/" + m_library + ".so").c_str(), RTLD_NOW);
        m_knownAfter = Known();
    }
    void ExpectOpeningRegistered() const {
        EXPECT_EQ(m_knownBefore, 0);
        EXPECT_EQ(m_knownAfter, static_cast<long>(m_classes.size()));
    }

private:
    OpenFirst(std::string library, std::vector<Port::XUID> classes)
        : m_library(std::move(library)), m_classes(std::move(classes)) {}
    long Known() const { return std::count_if(m_classes.begin(), m_classes.end(), &CitP::Factory::IsRegistered); }

    std::string m_library;
    std::vector<Port::XUID> m_classes;
    long m_knownBefore = -1, m_knownAfter = -1;
};

// A fixture's interpreter, which the fixture makes and sets, and what the tests ask of it.
struct InInterp {
    static int Eval(const std::string& script) { return Tcl_Eval(interp, script.c_str()); }
    static std::string Result() { return Tcl_GetStringResult(interp); }
    static std::string Var(const char* name) {
        const char* value = Tcl_GetVar(interp, name, TCL_GLOBAL_ONLY);
        return value ? value : "<unset>";
    }
    // The handle behind a word that a script holds.
    static Script::PtrHandleBase* HandleOf(const std::string& word) {
        Tcl_Obj* obj = Tcl_NewStringObj(word.c_str(), -1);
        Tcl_IncrRefCount(obj);
        Script::PtrHandleBase* handle = Script::PtrHandleBase::GetHandleFromTclObj(obj);
        Tcl_DecrRefCount(obj);
        return handle;
    }

    static inline Tcl_Interp* interp = nullptr;
};

}  // namespace harness
