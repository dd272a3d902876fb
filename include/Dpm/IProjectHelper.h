// Dpm::IProjectHelper: the helper a project is opened with. It travels as a raw pointer and is
// never counted by the package.
#pragma once

#include "CitI/IInterface.h"
#include "Port/StringBase.h"

namespace Dpm {

class IProjectHelper : public CitI::IInterface {
public:
    static constexpr const char* NAME = "IProjectHelper";

    virtual Port_String GetName() = 0;
};

}  // namespace Dpm
