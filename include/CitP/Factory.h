// CitP::Factory: the component factory. Component libraries register creators of component classes
// under their class identifiers; callers ask for new instances by identifier.
#pragma once

#include "CommonI/RefCountPtr.h"
#include "Port/StringBase.h"

namespace CitP {

// Makes a new component with no reference taken yet.
using ComponentCreator = CitI::IInterface* (*)();

// The function a component library exports under this name; it registers the library's classes.
using RegisterFunction = void (*)();
inline constexpr const char* kRegisterFunctionName = "CitP_RegisterComponents";

class Factory {
public:
    // Loads the component library `name` (`name`.so beside libPortBase.so, or an absolute path)
    // once and calls its registration function; later calls answer from a cache. True on success.
    static bool LoadLibraryFactory(const Port::StringBase<char>& name);

    // A new component of the class, counted once; null when no creator is registered.
    static CommonI::RefCountPtr<CitI::IInterface> CreateInstanceRef(const Port::XUID& classId);

    // Adds or replaces the creator of a class.
    static void RegisterClass(const Port::XUID& classId, ComponentCreator creator);
    static bool IsRegistered(const Port::XUID& classId);

    // How many times a library was actually opened (not answered from the cache).
    static int LibraryOpenCount();

    // Faults for tests: while a filter is set and answers false, the load or the creation fails.
    using LoadFilter = bool (*)(const char* name);
    using CreateFilter = bool (*)(const Port::XUID& classId);
    static void SetLoadFilter(LoadFilter filter);
    static void SetCreateFilter(CreateFilter filter);
};

}  // namespace CitP
