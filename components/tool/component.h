// The counted base of every interface object of the tool: the kit's component, offering the usage
// texts of its primary interface from the tool's help tables (help.cpp).
#pragma once

#include "TcltaskKit/Component.h"
#include "TcltaskKit/Help.h"

namespace kelmartool {

// The help table of one of the tool's interfaces, by the interface's NAME; an empty one for a name
// the tool does not implement.
const TcltaskKit::HelpTable& HelpOf(const char* interfaceName);

inline CommonI::RefCountPtr<ICommandHelp> NewCommandHelp(const char* interfaceName) {
    return TcltaskKit::NewCommandHelp(HelpOf(interfaceName));
}

template <class Primary, class... Faces>
class Component : public TcltaskKit::Component<Primary, Faces...> {
public:
    Component() : TcltaskKit::Component<Primary, Faces...>(NewCommandHelp(Primary::NAME)) {}
};

}  // namespace kelmartool
