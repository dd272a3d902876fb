// A program built against an installed tree, through its CMake package or its pkg-config file: the
// headers compile as they are, and the component factory finds its libraries in the installed
// package folder.
#include <cstdio>

#include "ArgMatch/ICmdArgMatcher.h"
#include "CitP/Factory.h"
#include "TcltaskI/ICollection.h"

int main() {
    const bool loaded = CitP::Factory::LoadLibraryFactory("libArgMatchKit");
    const CommonI::RefCountPtr<CitI::IInterface> matcher = CitP::Factory::CreateInstanceRef(CmdArgMatcherID);
    std::printf("%d %d %s\n", loaded, matcher != nullptr, Port::XUID(TcltaskI::ICollectionID).ToString().c_str());
    return 0;
}
