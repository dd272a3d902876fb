#include "cmd_arg_matcher.h"

#include <cstring>
#include <new>

#include "CitP/InstanceTable.h"
#include "option_name_list.h"

namespace ArgMatchKit {

namespace {

bool BeginsWith(const Port_String& name, const Port_String& typed) noexcept {
    const int32_t length = typed.Length();
    return name.Length() >= length && std::memcmp(name.c_str(), typed.c_str(), length) == 0;
}

}  // namespace

CmdArgMatcher::CmdArgMatcher() noexcept { CitP::InstanceTable::Born(CmdArgMatcherID); }

CmdArgMatcher::~CmdArgMatcher() { CitP::InstanceTable::Died(CmdArgMatcherID, nullptr); }

CitI::IInterface* CmdArgMatcher::GetInterface(const Port::XUID& id) {
    if (id == ICmdArgMatcherID || id == CitI::IInterfaceID) return this;
    if (id == CommonI::IRefCountID) return &m_counter;
    return nullptr;
}

CommonI::RESULT CmdArgMatcher::Match(const Port_String& typed,
                                     CommonI::RefCountPtr<IOptionNameSource>& candidates,
                                     CommonI::RefCountPtr<IOptionNameList>& matches) {
    // The source is the face of an iterator; the names are read through its other face. The
    // reference taken here keeps the iterator alive should the caller's pointer change meanwhile.
    const CommonI::RefCountPtr<IOptionNameIterator> names(candidates);
    if (!names) return 0;
    try {
        if (!matches) {
            auto* list = new (std::nothrow) OptionNameList;
            if (!list) return 0;
            matches = CommonI::RefCountPtr<IOptionNameList>(list);
        } else if (matches->Clear() != 1) {
            return 0;
        }
        // One step per candidate: 0 failed, 1 go on, 2 done.
        auto consider = [&](const Port_String& name) -> int {
            if (!BeginsWith(name, typed)) return 1;
            if (name.Length() == typed.Length()) {
                // An exact name is never ambiguous, whatever else begins with it.
                if (matches->Clear() != 1) return 0;
                return matches->Add(name) == 1 ? 2 : 0;
            }
            return matches->Add(name) == 1 ? 1 : 0;
        };
        // This library's own iterator is read in place; any other through copies of its names.
        if (auto* own = static_cast<IOptionNameIterator*>(names->GetInterface(OwnIteratorID))) {
            for (const Port_String& name : static_cast<OptionNameIterator*>(own)->Names())
                if (const int step = consider(name); step != 1) return step == 2 ? 1 : 0;
            return 1;
        }
        for (names->First(); !names->IsDone(); names->Next())
            if (const int step = consider(names->Current()); step != 1) return step == 2 ? 1 : 0;
        return 1;
    } catch (const std::bad_alloc&) {
        return 0;
    }
}

}  // namespace ArgMatchKit
