// Dpm::IProjectHelper: the helper a project is opened with. It travels as a raw pointer that carries
// no reference; the handle a script gets for it holds one while it lives, when the helper is counted.
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
