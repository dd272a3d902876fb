// Projects and the project manager. A project is one design file; the manager keeps the open
// projects in opening order, the last one being current. The root word `project` always means the
// current project, whichever it is.
#include "project.h"

#include <algorithm>
#include <filesystem>

#include "TcltaskI/ITclProjectMgr.h"
#include "property.h"

namespace kelmartool {

namespace {

std::string Summary(const Design& d) {
    return "design '" + d.name + "': " + std::to_string(d.cells.size()) + " cells, " + std::to_string(d.nets.size()) +
           " nets, " + std::to_string(d.ports.size()) + " ports, " + std::to_string(d.clocks.size()) + " clocks on " +
           d.device.name + " (" + std::to_string(d.device.columns) + "x" + std::to_string(d.device.rows) + ")";
}

std::pair<uint64_t, uint64_t> Key(const Port::XUID& id) { return {id.First(), id.Second()}; }

CitI::IInterface* RootOf(CitI::IInterface* object) {
    return object != nullptr ? object->GetInterface(CitI::IInterfaceID) : nullptr;
}

}  // namespace

std::string NormalFile(const std::string& file) {
    std::error_code ec;
    auto path = std::filesystem::weakly_canonical(std::filesystem::absolute(file, ec), ec);
    return ec ? file : path.string();
}

bool ProjectComponent::IsCurrent() const {
    auto state = m_state.lock();
    return state && state->Current() == this;
}

CommonI::RESULT ProjectComponent::OpenWithHelper(const Port_String& file, Dpm::IProjectHelper* helper,
                                                 Port_String& message) {
    if (file.IsEmpty()) return Fail(message, "no project file given");
    std::string error, text;
    auto design = ReadDesign(file.c_str(), text, error);
    if (!design) return Fail(message, error);
    m_file = NormalFile(file.c_str());
    m_text = std::move(text);
    m_helperName = helper != nullptr ? helper->GetName().c_str() : "";
    m_design = std::move(design);
    message = ("opened " + Summary(*m_design)).c_str();
    if (auto state = m_state.lock()) {
        auto& open = state->projects;
        auto here = std::find_if(open.begin(), open.end(), [this](const auto& p) { return p.get() == this; });
        if (here == open.end()) open.emplace_back(static_cast<TcltaskI::ITclProject*>(this));
        // A project opened anew becomes the current one.
        else std::rotate(here, here + 1, open.end());
        state->DesignChanged();
    }
    return 1;
}

void ProjectComponent::Drop() {
    m_design.reset();
    m_text.clear();
    m_components.clear();
    if (auto state = m_state.lock()) {
        const bool wasCurrent = IsCurrent();
        auto& open = state->projects;
        auto here = std::find_if(open.begin(), open.end(), [this](const auto& p) { return p.get() == this; });
        if (here != open.end()) {
            // Keep this object alive until the erase is over: the list may hold the last reference.
            CommonI::RefCountPtr<TcltaskI::ITclProject> keep(*here);
            open.erase(here);
            if (wasCurrent) state->DesignChanged();
        }
    }
}

CommonI::RESULT ProjectComponent::Close() {
    if (!IsOpen()) return 0;
    Drop();
    return 1;
}

CommonI::RESULT ProjectComponent::Sync(Port_String& message) {
    if (!IsOpen()) return Fail(message, kNoProject);
    std::string error;
    DesignWrite done;
    if (!WriteDesign(*m_design, m_file, m_text, done, error)) return Fail(message, error);
    m_text = std::move(done.text);
    message = (done.written ? "wrote " + m_file : "nothing to write: " + m_file + " holds the design").c_str();
    return 1;
}

bool ProjectComponent::Store(Design design, std::size_t& changed, std::string& error) {
    if (!IsOpen()) {
        error = kNoProject;
        return false;
    }
    DesignWrite done;
    if (!WriteDesign(design, m_file, m_text, done, error)) return false;
    *m_design = std::move(design);
    m_text = std::move(done.text);
    changed = done.changed;
    return true;
}

CommonI::RESULT ProjectComponent::Reload(Port_String& message) {
    if (!IsOpen()) return Fail(message, kNoProject);
    std::string error, text;
    auto design = ReadDesign(m_file, text, error);
    if (!design) return Fail(message, error);  // the design in memory stays as it was
    m_design = std::move(design);
    m_text = std::move(text);
    message = ("reloaded " + Summary(*m_design)).c_str();
    if (IsCurrent())
        if (auto state = m_state.lock()) state->DesignChanged();
    return 1;
}

CommonI::RESULT ProjectComponent::RegisterComponent(const Port::XUID& id, CitI::MIInterface& component) {
    if (id.IsNull() || !component || !IsOpen()) return 0;
    m_components[Key(id)] = component;
    return 1;
}

CommonI::RESULT ProjectComponent::UnRegisterComponent(CitI::MIInterface& component) {
    CitI::IInterface* root = RootOf(component.get());
    if (root == nullptr) return 0;
    for (auto it = m_components.begin(); it != m_components.end(); ++it) {
        if (RootOf(it->second.get()) == root) {
            m_components.erase(it);
            return 1;
        }
    }
    return 0;
}

CitI::MIInterface ProjectComponent::GetComponent(const Port::XUID& id) {
    auto it = m_components.find(Key(id));
    return it == m_components.end() ? CitI::MIInterface() : it->second;
}

// ---------------------------------------------------------------------------------------------

namespace {

ProjectComponent* CurrentOf(const StatePtr& state) { return state->Current(); }

class ProjectManager final : public Component<TcltaskI::ITclProjectMgr> {
public:
    explicit ProjectManager(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT Open(const Port_String& file, Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        return OpenWithHelper(file, nullptr, message);
    }

    CommonI::RESULT OpenWithHelper(const Port_String& file, Dpm::IProjectHelper* helper, Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        // A file already open is not read twice: it becomes the current project again.
        const std::string normal = NormalFile(file.c_str());
        for (auto& p : m_state->projects) {
            auto* project = static_cast<ProjectComponent*>(p.get());
            if (project->File() == normal) return project->OpenWithHelper(file, helper, message);
        }
        CommonI::RefCountPtr<TcltaskI::ITclProject> project(new ProjectComponent(m_state));
        return project->OpenWithHelper(file, helper, message);
    }

    CommonI::RESULT Close(const Port_String& file, Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        const std::string normal = NormalFile(file.c_str());
        for (auto& p : m_state->projects) {
            auto* project = static_cast<ProjectComponent*>(p.get());
            if (project->File() == normal) {
                message = ("closed " + normal).c_str();
                project->Drop();
                return 1;
            }
        }
        return Fail(message, "no open project has the file '" + std::string(file.c_str()) + "'");
    }

    CommonI::RESULT CloseCurrent(Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        if (current == nullptr) return Fail(message, kNoProject);
        message = ("closed " + current->File()).c_str();
        current->Drop();
        return 1;
    }

    CommonI::RESULT GetCurrentTclProject(CommonI::RefCountPtr<TcltaskI::ITclProject>& project,
                                         Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        project = current ? CommonI::RefCountPtr<TcltaskI::ITclProject>(current) : nullptr;
        return Report(current, message);
    }

    CommonI::RESULT GetCurrentHDProject(HdcI::MIHDProject& project, Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        project = current ? current->GetHDProject() : nullptr;
        return Report(current, message);
    }

    CommonI::RESULT GetCurrentProjectHelper(Dpm::IProjectHelper*& helper, Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        helper = current ? current->GetProjectHelper() : nullptr;
        return Report(current, message);
    }

    CommonI::RESULT SyncCurrent(Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        if (current == nullptr) return Report(nullptr, message);
        return current->Sync(message);
    }

    CommonI::RESULT ReloadCurrent(Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        if (current == nullptr) return Report(nullptr, message);
        return current->Reload(message);
    }

private:
    static CommonI::RESULT Report(ProjectComponent* current, Port_String& message) {
        if (current == nullptr) return Fail(message, kNoProject);
        message = current->File().c_str();
        return 1;
    }

    StatePtr m_state;
};

// The root word `project`: every operation goes to the project that is current when it runs.
class CurrentProject final : public Component<TcltaskI::ITclProject> {
public:
    explicit CurrentProject(const StatePtr& state) : m_state(state) {}

    CommonI::RESULT OpenWithHelper(const Port_String& file, Dpm::IProjectHelper* helper, Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        CommonI::RefCountPtr<TcltaskI::ITclProjectMgr> manager(
            static_cast<TcltaskI::ITclProjectMgr*>(NewProjectManager(m_state)->GetInterface(TcltaskI::ITclProjectMgrID)));
        return manager->OpenWithHelper(file, helper, message);
    }
    CommonI::RESULT Close() override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->Close() : 0;
    }
    Port_String GetFileName() override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->GetFileName() : Port_String();
    }
    HdcI::MIHDProject GetHDProject() override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->GetHDProject() : HdcI::MIHDProject();
    }
    Dpm::IProjectHelper* GetProjectHelper() override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->GetProjectHelper() : nullptr;
    }
    CommonI::RESULT Sync(Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->Sync(message) : Fail(message, kNoProject);
    }
    CommonI::RESULT Reload(Port_String& message) override {
        if (!Alive(*m_state, message)) return 0;
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->Reload(message) : Fail(message, kNoProject);
    }
    CommonI::RESULT RegisterComponent(const Port::XUID& id, CitI::MIInterface& component) override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->RegisterComponent(id, component) : 0;
    }
    CommonI::RESULT UnRegisterComponent(CitI::MIInterface& component) override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->UnRegisterComponent(component) : 0;
    }
    CitI::MIInterface GetComponent(const Port::XUID& id) override {
        ProjectComponent* current = CurrentOf(m_state);
        return current ? current->GetComponent(id) : CitI::MIInterface();
    }

private:
    StatePtr m_state;
};

}  // namespace

CitI::IInterface* NewProjectManager(const StatePtr& state) {
    return static_cast<TcltaskI::ITclProjectMgr*>(new ProjectManager(state));
}

CitI::IInterface* NewCurrentProject(const StatePtr& state) {
    return static_cast<TcltaskI::ITclProject*>(new CurrentProject(state));
}

}  // namespace kelmartool
