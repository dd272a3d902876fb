// Usage texts of every command word of every interface, offered through ICommandHelp. The words of
// a wrapper's own names for an operation (new_, delete_, export_, sizeof_) lead to the same text.
#include <cstring>
#include <string>
#include <string_view>

#include "component.h"

namespace kelmartool {

namespace {

struct Usage {
    const char* word;
    const char* text;
};

struct InterfaceHelp {
    const char* name;
    const char* summary;
    const Usage* usages;
    std::size_t count;
};

constexpr Usage kProject[] = {
    {"OpenWithHelper", "project OpenWithHelper FILE HELPER msgVar: reads the design file into this project"},
    {"Close", "project Close: closes the project"},
    {"GetFileName", "project GetFileName: the project file"},
    {"GetHDProject", "project GetHDProject: the design-data face of the project"},
    {"GetProjectHelper", "project GetProjectHelper: the helper face of the project"},
    {"Sync", "project Sync msgVar: writes the design back to its file"},
    {"Reload", "project Reload msgVar: reads the design again from its file"},
    {"RegisterComponent", "project RegisterComponent ID componentVar: keeps a component on the project under ID"},
    {"UnRegisterComponent", "project UnRegisterComponent componentVar: removes a kept component"},
    {"GetComponent", "project GetComponent ID: the component kept under ID, or 0"},
};

constexpr Usage kProjectMgr[] = {
    {"Open", "projmgr Open FILE msgVar: opens a design file as the current project"},
    {"OpenWithHelper", "projmgr OpenWithHelper FILE HELPER msgVar: opens a design file with a project helper"},
    {"Close", "projmgr Close FILE msgVar: closes the project of FILE"},
    {"CloseCurrent", "projmgr CloseCurrent msgVar: closes the current project"},
    {"GetCurrentTclProject", "projmgr GetCurrentTclProject projectVar msgVar: the current project"},
    {"GetCurrentHDProject", "projmgr GetCurrentHDProject projectVar msgVar: the current project's design-data face"},
    {"GetCurrentProjectHelper", "projmgr GetCurrentProjectHelper helperVar msgVar: the current project's helper"},
    {"SyncCurrent", "projmgr SyncCurrent msgVar: writes the current design back to its file"},
    {"ReloadCurrent", "projmgr ReloadCurrent msgVar: reads the current design again from its file"},
};

constexpr Usage kCollection[] = {
    {"append_to", "collection append_to NAME OBJECTS... ?-unique ?BOOL??: appends objects to the collection NAME"},
    {"equal", "collection equal COLL1 COLL2 ?-order_dependent ?BOOL??: 1 when both hold the same objects"},
    {"copy", "collection copy COLL: the objects of a collection as a new list"},
    {"foreach", "collection foreach VAR COLL BODY: runs BODY once per object with VAR set to it"},
    {"index", "collection index COLL POSITION: the object at POSITION, counted from 0"},
    {"remove_from", "collection remove_from NAME OBJECTS...: removes objects from the collection NAME"},
    {"sizeof", "collection sizeof COLL: the number of objects"},
    {"sizeof_", "collection sizeof COLL: the number of objects"},
    {"set", "collection set NAME OBJECTS: makes NAME a collection of exactly these objects"},
    {"get", "collection get NAME: the objects of the collection NAME"},
    {"properties", "collection properties: every collection with its size"},
};

constexpr Usage kGlobal[] = {
    {"set", "settings set NAME VALUE: sets a global setting, checking its type"},
    {"unset", "settings unset NAME: restores a built-in setting's default or removes a script's setting"},
    {"get", "settings get NAME: the value of a global setting"},
    {"properties", "settings properties: every global setting with its value"},
};

constexpr Usage kObject[] = {
    {"name", "obj name OBJECT: the object's name"},
    {"type", "obj type OBJECT: the kind of the object (cell, net, port, clock, bank, site)"},
    {"get", "obj get OBJECT PROPERTY: one property of the object"},
    {"properties", "obj properties OBJECT ?-descriptors ?BOOL??: the object's properties, or their descriptions"},
};

constexpr Usage kView[] = {
    {"zoom",
     "view zoom ?-full? ?-selection? ?-in? ?-out? ?-detailed? ?-last? ?-name OBJECT? ?-center {X Y}? ?-range {X0 Y0 X1 "
     "Y1}? ?-xrange {X0 X1}? ?-yrange {Y0 Y1}?: changes the part of the device in view"},
    {"pan",
     "view pan ?-left? ?-right? ?-up? ?-down? ?-top? ?-bottom? ?-farleft? ?-farright? ?-percentage P? ?-delta {DX DY}? "
     "?-name OBJECT?: moves the view"},
    {"next", "view next: the viewport after the one shown, from the history"},
    {"previous", "view previous: the viewport before the one shown, from the history"},
};

constexpr Usage kHighlight[] = {
    {"add", "highlight add OBJECTS... ?-color COLOR?: highlights objects, in the default colour when none is given"},
    {"remove", "highlight remove OBJECTS...: removes objects from the highlight"},
    {"new", "highlight new OBJECTS... ?-color COLOR?: replaces the highlight by these objects"},
    {"new_", "highlight new OBJECTS... ?-color COLOR?: replaces the highlight by these objects"},
    {"current", "highlight current: every highlighted object with its colour"},
    {"clear", "highlight clear: removes every highlight"},
    {"set", "highlight set NAME VALUE: sets a highlight setting such as default_highlight_color"},
    {"get", "highlight get NAME: the value of a highlight setting"},
    {"properties", "highlight properties ?-descriptors ?BOOL??: the highlight settings"},
};

constexpr Usage kSelection[] = {
    {"add", "selection add OBJECTS...: adds objects to the selection"},
    {"remove", "selection remove OBJECTS...: removes objects from the selection"},
    {"new", "selection new OBJECTS...: replaces the selection by these objects"},
    {"new_", "selection new OBJECTS...: replaces the selection by these objects"},
    {"current", "selection current: the selected objects"},
    {"clear", "selection clear: empties the selection"},
    {"set", "selection set NAME VALUE: sets a selection setting such as filter"},
    {"get", "selection get NAME: the value of a selection setting"},
    {"properties", "selection properties ?-descriptors ?BOOL??: the selection settings"},
};

constexpr Usage kSearch[] = {
    {"search",
     "search search TEXT ?-matchcase? ?-exactmatch? ?-regexp? ?-exp? ?-type KIND?... ?-in SCOPE?...: the objects whose "
     "names match TEXT (a glob pattern unless -exactmatch or -regexp); KIND all, cell, net, port, clock, bank, site; "
     "SCOPE project, selection, highlight or a collection"},
};

constexpr Usage kTiming[] = {
    {"properties", "timing properties ?-descriptors ?BOOL??: every analysis, or what each setting means"},
    {"delete", "timing delete ANALYSIS: removes an analysis"},
    {"delete_", "timing delete ANALYSIS: removes an analysis"},
    {"disable_constraints", "timing disable_constraints ANALYSIS CONSTRAINT...: leaves constraints out of the analysis"},
    {"disable_cpt", "timing disable_cpt ANALYSIS KIND ITEM...: leaves cells, ports, nets or clocks out of path tracing"},
    {"enable_constraints", "timing enable_constraints ANALYSIS CONSTRAINT...: takes constraints into the analysis again"},
    {"get", "timing get ANALYSIS NAME: one setting or result of an analysis"},
    {"enable_cpt", "timing enable_cpt ANALYSIS KIND ITEM...: takes cells, ports or nets into the analysis again"},
    {"new", "timing new ANALYSIS ?-name TITLE?: makes a new analysis"},
    {"new_", "timing new ANALYSIS ?-name TITLE?: makes a new analysis"},
    {"reset", "timing reset ANALYSIS: restores the default settings of an analysis"},
    {"run", "timing run ANALYSIS ?-overwrite ?BOOL??: computes arrival, required times and slacks"},
    {"save_as", "timing save_as ANALYSIS FILE: writes the report of an analysis"},
    {"saveas", "timing saveas ANALYSIS FILE: writes the report of an analysis"},
    {"set", "timing set ANALYSIS NAME VALUE: sets a setting of an analysis"},
    {"set_constraint", "timing set_constraint ANALYSIS NAME VALUE: sets a constraint: period:CLOCK, input_delay, output_delay, uncertainty, reference_clock"},
    {"set_endpoints", "timing set_endpoints ANALYSIS from|to only|except ITEM...: limits the paths to these start or end points"},
    {"set_query", "timing set_query ANALYSIS paths|fanout ITEM... ?-ld N? ?-hf N?: what a run reports"},
    {"set_filter", "timing set_filter ANALYSIS KIND MODE ITEM...: filters the reported paths by startpoint, endpoint, clock, through or slack"},
    {"show_settings", "timing show_settings ANALYSIS: every setting of an analysis"},
};

constexpr Usage kFloorplan[] = {
    {"open", "floorplan open: opens the floorplan of the current design"},
    {"open_full", "floorplan open_full FILE FORM MODE: opens the floorplan and reads a constraint file of FORM (ucf, csv, vhdl, vlog) into it, MODE replace or merge"},
    {"open_empty", "floorplan open_empty NAME DEVICE COLUMNS ROWS BANKS LAYOUT SSO_LIMIT SITE_CAPACITY CLOCK_LIMIT: opens an empty floorplan on a new device"},
    {"close", "floorplan close ?-nosave ?BOOL??: closes the floorplan, saving it unless -nosave"},
    {"save", "floorplan save: saves the floorplan into the design"},
    {"import", "floorplan import ?-ucf FILE? ?-csv FILE? ?-vhdl FILE? ?-vlog FILE?: reads constraints"},
    {"export", "floorplan export ?-ucf FILE? ?-csv FILE? ?-vhdl FILE? ?-vlog FILE?: writes constraints"},
    {"export_", "floorplan export ?-ucf FILE? ?-csv FILE? ?-vhdl FILE? ?-vlog FILE?: writes constraints"},
    {"group", "floorplan group BLOCK CELLS: groups cells into a block"},
    {"ungroup", "floorplan ungroup BLOCK: dissolves a block"},
    {"properties", "floorplan properties: the floorplan settings"},
    {"get", "floorplan get NAME: one floorplan setting"},
    {"set", "floorplan set NAME VALUE: sets a floorplan setting"},
    {"block_properties", "floorplan block_properties: every block"},
    {"block_get", "floorplan block_get BLOCK NAME: one property of a block"},
    {"block_set_constraint", "floorplan block_set_constraint BLOCK NAME VALUE: constrains a block (region X0Y0:X3Y3)"},
    {"block_delete_constraint", "floorplan block_delete_constraint BLOCK NAME: removes a block constraint"},
    {"prohibit", "floorplan prohibit SITES: no cell may be placed on these sites"},
    {"allow", "floorplan allow SITES: sites may hold cells again"},
    {"drc", "floorplan drc: overlaps, sites off the device, prohibited sites, over-full regions"},
    {"sso_analysis", "floorplan sso_analysis: outputs per bank against the bank's limit"},
    {"clock_analysis", "floorplan clock_analysis: clock nets per region"},
    {"make_pin_compatible", "floorplan make_pin_compatible FROM TO OFFSET MODE: the ports TO take the sites of the ports FROM, MODE copy (moved by OFFSET \"dx dy\") or swap"},
    {"zoom", "floorplan zoom SITE SITE: shows the sites between two corners; zoom block NAME a block's region"},
    {"refresh", "floorplan refresh: recomputes the floorplan view"},
};

template <std::size_t N>
constexpr InterfaceHelp Entry(const char* name, const char* summary, const Usage (&usages)[N]) {
    return {name, summary, usages, N};
}

constexpr InterfaceHelp kHelp[] = {
    Entry("ITclProject", "a project of the tool: one design file", kProject),
    Entry("ITclProjectMgr", "the project manager: opens and closes projects", kProjectMgr),
    Entry("ICollection", "named collections of design objects", kCollection),
    Entry("IGlobal", "typed global settings of the tool", kGlobal),
    Entry("IObject", "questions about single design objects", kObject),
    Entry("IGraphicalView", "the viewport over the device, with its history", kView),
    Entry("IHighlight", "coloured highlighting of design objects", kHighlight),
    Entry("ISelection", "the set of selected design objects", kSelection),
    Entry("ISearch", "search of design objects by name", kSearch),
    Entry("ITimingAnalysis", "named static timing analyses of the design", kTiming),
    Entry("IXFloorplan", "the floorplan: blocks, regions, prohibited sites and analyses", kFloorplan),
};

class CommandHelp final : public ICommandHelp {
public:
    explicit CommandHelp(const InterfaceHelp* help) : m_counter(this), m_help(help) {}

    CitI::IInterface* GetInterface(const Port::XUID& id) override {
        if (id == ICommandHelpID || id == CitI::IInterfaceID) return this;
        if (id == CommonI::IRefCountID) return &m_counter;
        return nullptr;
    }
    Port_String GetSummary() override { return m_help ? m_help->summary : ""; }
    Port_String GetTopics() override {
        std::string topics;
        for (std::size_t i = 0; m_help && i < m_help->count; ++i) {
            const std::string_view word = m_help->usages[i].word;
            if (word.ends_with('_')) continue;  // operation names are aliases, not topics
            if (!topics.empty()) topics += ' ';
            topics += word;
        }
        return topics.c_str();
    }
    Port_String GetHelp(const Port_String& word) override {
        for (std::size_t i = 0; m_help && i < m_help->count; ++i)
            if (std::strcmp(m_help->usages[i].word, word.c_str()) == 0) return Port_String("Usage: ", m_help->usages[i].text);
        return Port_String("No help for '", word.c_str(), "'");
    }

private:
    CommonI::RefCounter m_counter;
    const InterfaceHelp* m_help;
};

}  // namespace

ICommandHelp* NewCommandHelp(const char* interfaceName) {
    const InterfaceHelp* found = nullptr;
    for (const InterfaceHelp& h : kHelp)
        if (std::strcmp(h.name, interfaceName) == 0) found = &h;
    return new CommandHelp(found);
}

}  // namespace kelmartool
