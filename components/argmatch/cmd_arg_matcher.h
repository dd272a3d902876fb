// The command argument matcher component.
#pragma once

#include "ArgMatch/ICmdArgMatcher.h"
#include "Port/Recycle.h"

namespace ArgMatchKit {

// Matches a typed option name against candidates: a candidate equal to the typed name is the only
// match, otherwise every candidate that begins with the typed name matches.
class CmdArgMatcher final : public ICmdArgMatcher, public Port::Recycled<CmdArgMatcher> {
public:
    CmdArgMatcher() noexcept;
    ~CmdArgMatcher() override;
    CmdArgMatcher(const CmdArgMatcher&) = delete;
    CmdArgMatcher& operator=(const CmdArgMatcher&) = delete;

    CitI::IInterface* GetInterface(const Port::XUID& id) override;

    CommonI::RESULT Match(const Port_String& typed, CommonI::RefCountPtr<IOptionNameSource>& candidates,
                          CommonI::RefCountPtr<IOptionNameList>& matches) override;

private:
    CommonI::RefCounter m_counter{this};
};

}  // namespace ArgMatchKit
