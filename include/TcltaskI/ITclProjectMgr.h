// TcltaskI::ITclProjectMgr: the project manager. The last parameter of every operation is the
// message it fills in.
#pragma once

#include "TcltaskI/ITclProject.h"

namespace TcltaskI {

inline constexpr Port::XUIDLiteral ITclProjectMgrID{0xd611a2946a124be0ull, 0x81675590beb51670ull};

class ITclProjectMgr : public CitI::IInterface {
public:
    static constexpr const Port::XUIDLiteral& IID = ITclProjectMgrID;
    static constexpr const char* NAME = "ITclProjectMgr";

    virtual CommonI::RESULT Open(const Port_String& file, Port_String& message) = 0;
    virtual CommonI::RESULT OpenWithHelper(const Port_String& file, Dpm::IProjectHelper* helper, Port_String& message) = 0;
    virtual CommonI::RESULT Close(const Port_String& file, Port_String& message) = 0;
    virtual CommonI::RESULT CloseCurrent(Port_String& message) = 0;
    virtual CommonI::RESULT GetCurrentTclProject(CommonI::RefCountPtr<ITclProject>& project, Port_String& message) = 0;
    virtual CommonI::RESULT GetCurrentHDProject(HdcI::MIHDProject& project, Port_String& message) = 0;
    // Writes the pointer on every path, null or not.
    virtual CommonI::RESULT GetCurrentProjectHelper(Dpm::IProjectHelper*& helper, Port_String& message) = 0;
    virtual CommonI::RESULT SyncCurrent(Port_String& message) = 0;
    virtual CommonI::RESULT ReloadCurrent(Port_String& message) = 0;
};

}  // namespace TcltaskI
