// HdcI::IHDProject: the design-data face of a project.
#pragma once

#include "CommonI/RefCountPtr.h"
#include "Port/StringBase.h"

namespace HdcI {

inline constexpr Port::XUIDLiteral IHDProjectID{0xf358b3bb63aa4d89ull, 0xa57e507733c84974ull};

class IHDProject : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = IHDProjectID;
    static constexpr const char* NAME = "IHDProject";

    virtual Port_String GetName() = 0;
    virtual Port_String GetFileName() = 0;
};

using MIHDProject = CommonI::RefCountPtr<IHDProject>;

}  // namespace HdcI
