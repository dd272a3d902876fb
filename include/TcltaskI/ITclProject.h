// TcltaskI::ITclProject: one open project of the tool.
#pragma once

#include "CommonI/RefCountPtr.h"
#include "Dpm/IProjectHelper.h"
#include "HdcI/IHDProject.h"
#include "Port/StringBase.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral ITclProjectID{0x9bd2871ff36941f3ull, 0xad7abd114008d664ull};

class ITclProject : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ITclProjectID;
    static constexpr const char* NAME = "ITclProject";

    virtual CommonI::RESULT OpenWithHelper(const Port_String& file, Dpm::IProjectHelper* helper, Port_String& message) = 0;
    virtual CommonI::RESULT Close() = 0;
    virtual Port_String GetFileName() = 0;
    virtual HdcI::MIHDProject GetHDProject() = 0;
    // No reference passes with the pointer.
    virtual Dpm::IProjectHelper* GetProjectHelper() = 0;
    virtual CommonI::RESULT Sync(Port_String& message) = 0;
    virtual CommonI::RESULT Reload(Port_String& message) = 0;
    virtual CommonI::RESULT RegisterComponent(const Port::XUID& id, CitI::MIInterface& component) = 0;
    virtual CommonI::RESULT UnRegisterComponent(CitI::MIInterface& component) = 0;
    virtual CitI::MIInterface GetComponent(const Port::XUID& id) = 0;
};

}  // namespace TcltaskI
