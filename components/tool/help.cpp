// Usage texts of every command word of every interface, offered through the kit's ICommandHelp.
// The words of a wrapper's own names for an operation (new_, delete_, export_, sizeof_) lead to the
// same text. A text is the call, a colon, what the command does and last what it gives back:
// "CALL: DOES; returns WHAT", or "CALL: returns WHAT" for a question. The call holds no colon.
#include <cstring>

#include "component.h"

namespace kelmartool {

namespace {

using TcltaskKit::Usage;

struct InterfaceHelp {
    const char* name;
    TcltaskKit::HelpTable table;
};

constexpr Usage kProject[] = {
    {"OpenWithHelper", "project OpenWithHelper FILE HELPER msgVar: reads the design file into this project; returns 1, or 0 with the reason in msgVar"},
    {"Close", "project Close: closes the project; returns 1, or 0 when none is open"},
    {"GetFileName", "project GetFileName: returns the project file, empty when none is open"},
    {"GetHDProject", "project GetHDProject: returns the design-data face of the project, or 0"},
    {"GetProjectHelper", "project GetProjectHelper: returns the helper face of the project, or 0"},
    {"Sync", "project Sync msgVar: writes the design back to its file; returns 1, or 0 with the reason in msgVar"},
    {"Reload", "project Reload msgVar: reads the design again from its file; returns 1, or 0 with the reason in msgVar"},
    {"RegisterComponent", "project RegisterComponent ID componentVar: keeps a component on the project under ID; returns 1, or 0 when it cannot"},
    {"UnRegisterComponent", "project UnRegisterComponent componentVar: removes a kept component; returns 1, or 0 when it was not kept"},
    {"GetComponent", "project GetComponent ID: returns the component kept under ID, or 0"},
};

constexpr Usage kProjectMgr[] = {
    {"Open", "projmgr Open FILE msgVar: opens a design file as the current project; returns 1, or 0 with the reason in msgVar"},
    {"OpenWithHelper", "projmgr OpenWithHelper FILE HELPER msgVar: opens a design file with a project helper; returns 1, or 0 with the reason in msgVar"},
    {"Close", "projmgr Close FILE msgVar: closes the project of FILE; returns 1, or 0 with the reason in msgVar"},
    {"CloseCurrent", "projmgr CloseCurrent msgVar: closes the current project; returns 1, or 0 with the reason in msgVar"},
    {"GetCurrentTclProject", "projmgr GetCurrentTclProject projectVar msgVar: puts the current project into projectVar and its file into msgVar; returns 1, or 0 with the reason in msgVar"},
    {"GetCurrentHDProject", "projmgr GetCurrentHDProject projectVar msgVar: puts the current project's design-data face into projectVar and its file into msgVar; returns 1, or 0 with the reason in msgVar"},
    {"GetCurrentProjectHelper", "projmgr GetCurrentProjectHelper helperVar msgVar: puts the current project's helper into helperVar and its file into msgVar; returns 1, or 0 with the reason in msgVar"},
    {"SyncCurrent", "projmgr SyncCurrent msgVar: writes the current design back to its file; returns 1, or 0 with the reason in msgVar"},
    {"ReloadCurrent", "projmgr ReloadCurrent msgVar: reads the current design again from its file; returns 1, or 0 with the reason in msgVar"},
};

constexpr Usage kCollection[] = {
    {"append_to", "collection append_to NAME OBJECTS... ?-unique ?BOOL??: appends objects to the collection NAME; returns its objects"},
    {"equal", "collection equal COLL1 COLL2 ?-order_dependent ?BOOL??: returns 1 when both hold the same objects, else 0"},
    {"copy", "collection copy COLL: returns the objects of a collection as a new list"},
    {"foreach", "collection foreach VAR COLL BODY: runs BODY once per object with VAR set to it; returns nothing"},
    {"index", "collection index COLL POSITION: returns the object at POSITION, counted from 0"},
    {"remove_from", "collection remove_from NAME OBJECTS...: removes objects from the collection NAME; returns its objects"},
    {"sizeof", "collection sizeof COLL: returns the number of objects"},
    {"sizeof_", "collection sizeof COLL: returns the number of objects"},
    {"set", "collection set NAME OBJECTS: makes NAME a collection of exactly these objects; returns its objects"},
    {"get", "collection get NAME: returns the objects of the collection NAME"},
    {"properties", "collection properties: returns a dict of every collection and its size"},
};

constexpr Usage kGlobal[] = {
    {"set", "settings set NAME VALUE: sets a global setting, checking its type; returns the value as kept"},
    {"unset", "settings unset NAME: restores a built-in setting's default or removes a script's setting; returns the default, or nothing"},
    {"get", "settings get NAME: returns the value of a global setting"},
    {"properties", "settings properties: returns a dict of every global setting and its value"},
};

constexpr Usage kObject[] = {
    {"name", "obj name OBJECT: returns the object's name"},
    {"type", "obj type OBJECT: returns the kind of the object (cell, net, port, clock, bank, site)"},
    {"get", "obj get OBJECT PROPERTY: returns one property of the object"},
    {"properties", "obj properties OBJECT ?-descriptors ?BOOL??: returns a dict of the object's properties, or with -descriptors a list of their descriptions"},
};

constexpr Usage kView[] = {
    {"zoom",
     "view zoom ?-full? ?-selection? ?-in? ?-out? ?-detailed? ?-last? ?-name OBJECT? ?-center {X Y}? ?-range {X0 Y0 X1 "
     "Y1}? ?-xrange {X0 X1}? ?-yrange {Y0 Y1}?: changes the part of the device in view; returns the viewport, a dict of "
     "x, y, width and height"},
    {"pan",
     "view pan ?-left? ?-right? ?-up? ?-down? ?-top? ?-bottom? ?-farleft? ?-farright? ?-percentage P? ?-delta {DX DY}? "
     "?-name OBJECT?: moves the view; returns the viewport, a dict of x, y, width and height"},
    {"next", "view next: shows the viewport after the one shown, from the history; returns it, a dict of x, y, width and height"},
    {"previous", "view previous: shows the viewport before the one shown, from the history; returns it, a dict of x, y, width and height"},
};

constexpr Usage kHighlight[] = {
    {"add", "highlight add OBJECTS... ?-color COLOR?: highlights objects, in the default colour when none is given; returns the number of highlighted objects"},
    {"remove", "highlight remove OBJECTS...: removes objects from the highlight; returns the number of highlighted objects"},
    {"new", "highlight new OBJECTS... ?-color COLOR?: replaces the highlight by these objects; returns the number of highlighted objects"},
    {"new_", "highlight new OBJECTS... ?-color COLOR?: replaces the highlight by these objects; returns the number of highlighted objects"},
    {"current", "highlight current: returns a dict of every highlighted object and its colour"},
    {"clear", "highlight clear: removes every highlight; returns nothing"},
    {"set", "highlight set NAME VALUE: sets a highlight setting such as default_highlight_color; returns the value as kept"},
    {"get", "highlight get NAME: returns the value of a highlight setting"},
    {"properties", "highlight properties ?-descriptors ?BOOL??: returns a dict of the highlight settings, or with -descriptors a list of their descriptions"},
};

constexpr Usage kSelection[] = {
    {"add", "selection add OBJECTS...: adds objects to the selection; returns the selected objects"},
    {"remove", "selection remove OBJECTS...: removes objects from the selection; returns the selected objects"},
    {"new", "selection new OBJECTS...: replaces the selection by these objects; returns the selected objects"},
    {"new_", "selection new OBJECTS...: replaces the selection by these objects; returns the selected objects"},
    {"current", "selection current: returns the selected objects"},
    {"clear", "selection clear: empties the selection; returns nothing"},
    {"set", "selection set NAME VALUE: sets a selection setting such as filter; returns the value as kept"},
    {"get", "selection get NAME: returns the value of a selection setting"},
    {"properties", "selection properties ?-descriptors ?BOOL??: returns a dict of the selection settings, or with -descriptors a list of their descriptions"},
};

constexpr Usage kSearch[] = {
    {"search",
     "search search TEXT ?-matchcase? ?-exactmatch? ?-regexp? ?-exp? ?-type KIND?... ?-in SCOPE?...: finds the objects "
     "whose names match TEXT (a glob pattern unless -exactmatch or -regexp), KIND all, cell, net, port, clock, bank or "
     "site, SCOPE project, selection, highlight or a collection; returns the objects found"},
};

constexpr Usage kTiming[] = {
    {"properties", "timing properties ?-descriptors ?BOOL??: returns the names of the analyses, or with -descriptors a list of what each setting means"},
    {"delete", "timing delete ANALYSIS: removes an analysis; returns the names of the analyses left"},
    {"delete_", "timing delete ANALYSIS: removes an analysis; returns the names of the analyses left"},
    {"disable_constraints", "timing disable_constraints ANALYSIS CONSTRAINT...: leaves constraints out of the analysis; returns its constraints as a dict"},
    {"disable_cpt", "timing disable_cpt ANALYSIS KIND ITEM...: leaves cells, ports, nets or clocks out of path tracing; returns the items left out, by kind"},
    {"enable_constraints", "timing enable_constraints ANALYSIS CONSTRAINT...: takes constraints into the analysis again; returns its constraints as a dict"},
    {"get", "timing get ANALYSIS NAME: returns one setting or result of an analysis"},
    {"enable_cpt", "timing enable_cpt ANALYSIS KIND ITEM...: takes cells, ports, nets or clocks into path tracing again; returns the items left out, by kind"},
    {"new", "timing new ANALYSIS ?-name TITLE?: makes a new analysis; returns ANALYSIS"},
    {"new_", "timing new ANALYSIS ?-name TITLE?: makes a new analysis; returns ANALYSIS"},
    {"reset", "timing reset ANALYSIS: restores the default settings of an analysis; returns its settings as show_settings does"},
    {"run", "timing run ANALYSIS ?-overwrite ?BOOL??: computes arrival, required times and slacks; returns the reported paths, worst first, each a dict"},
    {"save_as", "timing save_as ANALYSIS FILE: writes the report of an analysis; returns FILE"},
    {"saveas", "timing saveas ANALYSIS FILE: writes the report of an analysis; returns FILE"},
    {"set", "timing set ANALYSIS NAME VALUE: sets the name or description of an analysis; returns VALUE"},
    {"set_constraint", "timing set_constraint ANALYSIS NAME VALUE: sets a constraint (period:CLOCK, input_delay, output_delay, uncertainty, reference_clock); returns the constraints as a dict"},
    {"set_endpoints", "timing set_endpoints ANALYSIS from|to only|except ITEM...: limits the paths to these start or end points; returns the endpoint rules as a dict"},
    {"set_query", "timing set_query ANALYSIS paths|fanout ITEM... ?-ld N? ?-hf N?: sets what a run reports; returns the queries as a dict"},
    {"set_filter", "timing set_filter ANALYSIS KIND MODE ITEM...: filters the reported paths by startpoint, endpoint, clock, through or slack; returns the filters as a dict"},
    {"show_settings", "timing show_settings ANALYSIS: returns every setting of an analysis as a dict"},
};

constexpr Usage kFloorplan[] = {
    {"open", "floorplan open: opens the floorplan of the current design; returns its settings as properties does"},
    {"open_full", "floorplan open_full FILE FORM MODE: opens the floorplan and reads a constraint file of FORM (ucf, csv, vhdl, vlog) into it, MODE replace or merge; returns its settings as properties does"},
    {"open_empty", "floorplan open_empty NAME DEVICE COLUMNS ROWS BANKS LAYOUT SSO_LIMIT SITE_CAPACITY CLOCK_LIMIT: opens an empty floorplan on a new device; returns its settings as properties does"},
    {"close", "floorplan close ?-nosave ?BOOL??: closes the floorplan, saving it as save does unless -nosave; returns a dict of saved (1 or 0), file and changed as save answers them (empty and 0 with -nosave)"},
    {"save", "floorplan save: saves the floorplan into the project file, changing only the values that differ and keeping the file's layout and key order; returns a dict of file (the project file) and changed (the number of values changed, added or removed, 0 when the file was left as it was)"},
    {"import", "floorplan import ?-ucf FILE? ?-csv FILE? ?-vhdl FILE? ?-vlog FILE?: reads constraints; returns a dict of the numbers of blocks, prohibited sites and ports read"},
    {"export", "floorplan export ?-ucf FILE? ?-csv FILE? ?-vhdl FILE? ?-vlog FILE?: writes constraints; returns the files written"},
    {"export_", "floorplan export ?-ucf FILE? ?-csv FILE? ?-vhdl FILE? ?-vlog FILE?: writes constraints; returns the files written"},
    {"group", "floorplan group BLOCK CELLS: groups cells into a block; returns the cells of the block"},
    {"ungroup", "floorplan ungroup BLOCKS: dissolves blocks; returns the names of the blocks left"},
    {"properties", "floorplan properties: returns a dict of the floorplan settings"},
    {"get", "floorplan get NAME: returns one floorplan setting"},
    {"set", "floorplan set NAME VALUE: sets a floorplan setting; returns its new value"},
    {"block_properties", "floorplan block_properties: returns a dict of every block and its properties"},
    {"block_get", "floorplan block_get BLOCKS NAME: returns one property of a block, or for several blocks a dict by block"},
    {"block_set_constraint", "floorplan block_set_constraint BLOCKS NAME VALUE: constrains blocks (region X0Y0:X3Y3); returns the block's properties, or for several a dict by block"},
    {"block_delete_constraint", "floorplan block_delete_constraint BLOCKS NAME: removes a block constraint; returns the block's properties, or for several a dict by block"},
    {"prohibit", "floorplan prohibit SITES: no cell may be placed on these sites; returns every prohibited site"},
    {"allow", "floorplan allow SITES: sites may hold cells again; returns every prohibited site"},
    {"drc", "floorplan drc: checks for overlaps, sites off the device, prohibited sites, over-full regions; returns the findings, each a dict"},
    {"sso_analysis", "floorplan sso_analysis: counts the outputs per bank against the bank's limit; returns a list of one dict per bank"},
    {"clock_analysis", "floorplan clock_analysis: counts the clock nets per region; returns a list of one dict per region"},
    {"make_pin_compatible", "floorplan make_pin_compatible FROM TO OFFSET MODE: the ports TO take the sites of the ports FROM, MODE copy (moved by OFFSET \"dx dy\") or swap; returns a dict of the ports moved and their sites"},
    {"zoom", "floorplan zoom SITE SITE: shows the sites between two corners, a block's region (zoom block NAME) or the device (zoom fit X); returns the view as a dict of x0, y0, x1, y1, region and blocks"},
    {"refresh", "floorplan refresh: recomputes the floorplan view; returns the view as a dict of x0, y0, x1, y1, region and blocks"},
};

constexpr InterfaceHelp kHelp[] = {
    {"ITclProject", {"a project of the tool: one design file", kProject}},
    {"ITclProjectMgr", {"the project manager: opens and closes projects", kProjectMgr}},
    {"ICollection", {"named collections of design objects", kCollection}},
    {"IGlobal", {"typed global settings of the tool", kGlobal}},
    {"IObject", {"questions about single design objects", kObject}},
    {"IGraphicalView", {"the viewport over the device, with its history", kView}},
    {"IHighlight", {"coloured highlighting of design objects", kHighlight}},
    {"ISelection", {"the set of selected design objects", kSelection}},
    {"ISearch", {"search of design objects by name", kSearch}},
    {"ITimingAnalysis", {"named static timing analyses of the design", kTiming}},
    {"IXFloorplan", {"the floorplan: blocks, regions, prohibited sites and analyses", kFloorplan}},
};

constexpr TcltaskKit::HelpTable kNoHelp{"", {}};

}  // namespace

const TcltaskKit::HelpTable& HelpOf(const char* interfaceName) {
    for (const InterfaceHelp& h : kHelp)
        if (std::strcmp(h.name, interfaceName) == 0) return h.table;
    return kNoHelp;
}

}  // namespace kelmartool
