// A project of the tool: one design read from one file, in its three faces.
#pragma once

#include <map>
#include <memory>
#include <string>

#include "Dpm/IProjectHelper.h"
#include "HdcI/IHDProject.h"
#include "TcltaskI/ITclProject.h"
#include "component.h"
#include "design.h"

namespace kelmartool {

class ProjectComponent final : public Component<TcltaskI::ITclProject, HdcI::IHDProject, Dpm::IProjectHelper> {
public:
    explicit ProjectComponent(const StatePtr& state) : m_state(state) {}

    // ITclProject
    CommonI::RESULT OpenWithHelper(const Port_String& file, Dpm::IProjectHelper* helper, Port_String& message) override;
    CommonI::RESULT Close() override;
    Port_String GetFileName() override { return m_file.c_str(); }
    HdcI::MIHDProject GetHDProject() override { return HdcI::MIHDProject(static_cast<HdcI::IHDProject*>(this)); }
    Dpm::IProjectHelper* GetProjectHelper() override { return this; }
    CommonI::RESULT Sync(Port_String& message) override;
    CommonI::RESULT Reload(Port_String& message) override;
    CommonI::RESULT RegisterComponent(const Port::XUID& id, CitI::MIInterface& component) override;
    CommonI::RESULT UnRegisterComponent(CitI::MIInterface& component) override;
    CitI::MIInterface GetComponent(const Port::XUID& id) override;

    // IHDProject and IProjectHelper: the design's name.
    Port_String GetName() override { return m_design ? m_design->name.c_str() : ""; }

    bool IsOpen() const noexcept { return m_design != nullptr; }
    Design* GetDesign() const noexcept { return m_design.get(); }
    const std::string& File() const noexcept { return m_file; }
    const std::string& HelperName() const noexcept { return m_helperName; }
    // Writes `design` to the project file, changing the values that differ from the file's text
    // (WriteDesign), and makes it the project's design; `changed` is the number of values changed.
    // On failure neither the file nor the design in memory changes, and `error` says why.
    bool Store(Design design, std::size_t& changed, std::string& error);
    // Drops the design and the registered components; the project leaves the open list.
    void Drop();

private:
    bool IsCurrent() const;

    std::weak_ptr<ToolState> m_state;  // the state holds the project, not the other way round
    std::string m_file;
    std::string m_helperName;
    std::unique_ptr<Design> m_design;
    std::string m_text;  // the file's content when it was last read or written: what a write changes
    std::map<std::pair<uint64_t, uint64_t>, CitI::MIInterface> m_components;
};

// The absolute, normalised form of a file name, so that one file is one project.
std::string NormalFile(const std::string& file);

// The root objects of the shell (project.cpp): the manager and the face of the current project.
CitI::IInterface* NewProjectManager(const StatePtr& state);
CitI::IInterface* NewCurrentProject(const StatePtr& state);

}  // namespace kelmartool
