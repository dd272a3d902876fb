// The reference tool's in-memory design model and the per-interpreter tool state.
//
// A design is a device (a grid of sites X<col>Y<row>, grouped into banks), cells placed on sites,
// nets from one driver to many loads, ports on sites and clocks. Every cell, net, port, clock, bank
// and site has a name unique across all of them, so that a script can name any object by a plain
// word. The floorplan constraints (blocks and prohibited sites) belong to the design, since they are
// saved with it; the timing analyses live in the tool state only.
#pragma once

#include <tcl.h>

#include <cstdint>
#include <initializer_list>
#include <map>
#include <memory>
#include <optional>
#include <set>
#include <string>
#include <string_view>
#include <vector>

#include "CommonI/RefCountPtr.h"
#include "Script/TclObjRef.h"
#include "TcltaskI/ITclProject.h"

namespace TcltaskI {
class ITimingAnalysis;
class IXFloorplan;
}  // namespace TcltaskI

namespace kelmartool {

// ---------------------------------------------------------------------------------------------
// Limits of what a design holds, the same whether a file or a script gives it.

inline constexpr int kMaxSide = 100000;    // columns or rows of a device
inline constexpr int kMaxCount = 1000000;  // a site capacity, an sso limit or a clock limit
// Banks of one device: their checks compare every pair, and real devices have a few dozen.
inline constexpr int kMaxBanks = 1000;
// A delay, setup time or period in ns: one second is far beyond any clocked design, and sums of
// such times over any path stay finite.
inline constexpr double kMaxTime = 1e9;

// ---------------------------------------------------------------------------------------------
// Design objects

enum class Kind { Cell, Net, Port, Clock, Bank, Site };

// The word a script sees for a kind ("cell", "net", ...), and back. FromWord gives nothing for a
// word that is no kind.
const char* KindWord(Kind kind) noexcept;
std::optional<Kind> KindFromWord(std::string_view word) noexcept;

// Free-form properties of an object, in name order.
using Properties = std::map<std::string, std::string>;

struct Bank {
    std::string name;
    // The sites of the bank: columns x0..x1 and rows y0..y1, both inclusive.
    int x0 = 0, y0 = 0, x1 = 0, y1 = 0;
    // How many output ports the bank may drive at once before simultaneous switching is a risk.
    int ssoLimit = 0;

    bool Contains(int x, int y) const noexcept { return x >= x0 && x <= x1 && y >= y0 && y <= y1; }
};

struct SiteRef {
    int x = 0;
    int y = 0;
    friend bool operator==(const SiteRef&, const SiteRef&) = default;
    friend auto operator<=>(const SiteRef&, const SiteRef&) = default;
};

struct Device {
    std::string name;
    int columns = 0;
    int rows = 0;
    // Cells one site can hold.
    int siteCapacity = 1;
    std::vector<Bank> banks;

    // "X<col>Y<row>".
    static std::string SiteName(int x, int y);
    static std::string SiteName(const SiteRef& site) { return SiteName(site.x, site.y); }
    // The site a name stands for when it lies on this device.
    std::optional<SiteRef> ParseSite(std::string_view name) const;
    bool OnDevice(int x, int y) const noexcept { return x >= 0 && y >= 0 && x < columns && y < rows; }
    // The bank that holds the site, or null.
    const Bank* BankOf(int x, int y) const noexcept;
};

struct Cell {
    std::string name;
    std::string type;        // LUT, FF, IOB, RAM, ...
    std::string site;        // empty while unplaced
    double delay = 0.0;      // ns: propagation, or clock to output for a sequential cell
    double setup = 0.0;      // ns: setup time of a sequential cell
    bool sequential = false; // starts and ends timing paths
    std::string clock;       // the clock of a sequential cell
    Properties properties;
};

struct Net {
    std::string name;
    std::string driver;              // a cell or an input port
    std::vector<std::string> loads;  // cells or output ports
    double delay = 0.0;              // ns, from the driver to every load
    Properties properties;
};

struct IoPort {
    std::string name;
    bool output = false;  // "in" or "out" in the file
    std::string site;
    std::string standard;  // I/O standard, free text
    Properties properties;
};

struct Clock {
    std::string name;
    double period = 0.0;  // ns
    std::string net;      // the net it drives
    Properties properties;
};

// A floorplan block: cells grouped into a region of the device.
struct Block {
    std::string name;
    std::vector<std::string> cells;
    // The region, columns x0..x1 and rows y0..y1 inclusive; absent until constrained.
    std::optional<int> x0, y0, x1, y1;
    Properties constraints;
    friend bool operator==(const Block&, const Block&) = default;
};

// What a name stands for inside one design.
struct ObjectRef {
    Kind kind = Kind::Cell;
    std::size_t index = 0;  // into the vector of that kind; for a site x + y * columns
};

class Design {
public:
    std::string name;
    Device device;
    std::vector<Cell> cells;
    std::vector<Net> nets;
    std::vector<IoPort> ports;
    std::vector<Clock> clocks;
    std::vector<Block> blocks;
    std::set<std::string> prohibited;  // site names
    Properties properties;

    // Rebuilds the name index and checks the design: unique names, every reference resolvable,
    // sites on the device. Empty on success, else the first problem in words.
    std::string Index();

    std::optional<ObjectRef> Find(std::string_view name) const;
    const Cell* FindCell(std::string_view name) const;
    const Net* FindNet(std::string_view name) const;
    const IoPort* FindPort(std::string_view name) const;
    const Clock* FindClock(std::string_view name) const;
    const Bank* FindBank(std::string_view name) const;
    Cell* FindCell(std::string_view name);
    Net* FindNet(std::string_view name);
    IoPort* FindPort(std::string_view name);
    Clock* FindClock(std::string_view name);
    Block* FindBlock(std::string_view name);

    // The type word of a named object ("cell", ...), or empty.
    std::string TypeOf(std::string_view name) const;
    // The properties of a named object in name order, built-in ones included, or nothing.
    std::optional<Properties> PropertiesOf(std::string_view name) const;
    // One of them, worked out alone; nothing when the object or the property does not exist.
    std::optional<std::string> PropertyOf(std::string_view name, const std::string& property) const;

private:
    Properties Collect(const ObjectRef& ref, std::string_view name, const std::string* only) const;

    std::map<std::string, ObjectRef, std::less<>> m_index;
};

// JSON (design_io.cpp). Read gives the design and `text`, the file's content, or leaves `error`
// saying why, with the file name.
std::unique_ptr<Design> ReadDesign(const std::string& file, std::string& text, std::string& error);
std::unique_ptr<Design> ParseDesign(const std::string& text, std::string& error);

// What a write of a design did to its file.
struct DesignWrite {
    std::string text;         // the file's content now
    std::size_t changed = 0;  // values of the former text that were changed, added or removed
    bool written = false;     // false when the file held the text already and was left alone
};
// Writes `design` into `file`, whose content when it was last read or written is `source`. Only
// the values that differ from what `source` holds are changed, in place (json_edit.h): the layout,
// the order of the keys and the fields the tool does not know stay as they were, and a design that
// did not change gives `source` again. An empty `source` gives the whole design, formatted anew.
// The text is made first and then replaces the file at once (file_io.h), unless the file holds it
// already; on any failure the file is as it was and `error` names the file and why.
bool WriteDesign(const Design& design, const std::string& file, const std::string& source, DesignWrite& done,
                 std::string& error);
// The JSON text of a design, formatted whole; false with `error` naming the first field that
// cannot be written.
bool FormatDesign(const Design& design, std::string& text, std::string& error);

// ---------------------------------------------------------------------------------------------
// Typed settings, as kept by the global settings, the highlight and the selection.

enum class SettingType { Bool, Int, Double, String, Color, Choice };
const char* SettingTypeWord(SettingType type) noexcept;

struct Setting {
    SettingType type = SettingType::String;
    std::string value;         // canonical text of the value
    std::string defaultValue;  // what unset restores; a user setting has none and goes
    std::string description;
    std::vector<std::string> choices;  // for Choice
    // For Int and Double: the values the users of the setting can work with, both included.
    struct Bounds {
        double low, high;
    };
    std::optional<Bounds> bounds;
    bool builtIn = false;
};

class SettingTable {
public:
    void Define(const std::string& name, SettingType type, const std::string& value, const std::string& description,
                std::vector<std::string> choices = {});
    void Define(const std::string& name, SettingType type, const std::string& value, const std::string& description,
                Setting::Bounds bounds);
    // Checks `text` against the setting's type and stores its canonical form. A name that is not
    // defined becomes a user string setting when `allowNew` is true. Empty on success.
    std::string Set(const std::string& name, const std::string& text, bool allowNew);
    // A built-in setting goes back to its default, a user setting goes. Empty on success.
    std::string Unset(const std::string& name);
    const Setting* Find(const std::string& name) const;
    // The value of a built-in Int or Double setting, read from its canonical text; `fallback` when
    // there is no such setting.
    long long Integer(const std::string& name, long long fallback) const;
    double Number(const std::string& name, double fallback) const;
    const std::map<std::string, Setting>& All() const noexcept { return m_settings; }

private:
    std::map<std::string, Setting> m_settings;
};

// Validates a colour: a named colour or #rrggbb. Gives the canonical lower-case form or nothing.
std::optional<std::string> CanonicalColor(std::string_view text);

// ---------------------------------------------------------------------------------------------
// The tool state of one interpreter

class ProjectComponent;  // project.cpp
struct TimingData;       // timing.cpp
struct FloorplanData;    // floorplan.cpp

struct Viewport {
    double x = 0, y = 0, width = 0, height = 0;
    friend bool operator==(const Viewport&, const Viewport&) = default;
};

struct ViewState {
    std::vector<Viewport> history;  // every viewport shown, oldest first
    std::size_t position = 0;       // the one shown now
};

struct ToolState {
    explicit ToolState(Tcl_Interp* interp);
    ~ToolState();
    ToolState(const ToolState&) = delete;
    ToolState& operator=(const ToolState&) = delete;

    // The interpreter that owns the state; null once it is gone (Shutdown). Objects of the tool may
    // outlive it, kept by another interpreter: every operation of theirs then fails (Alive).
    Tcl_Interp* interp;

    // Open projects in opening order; the last is the current one.
    std::vector<CommonI::RefCountPtr<TcltaskI::ITclProject>> projects;
    ProjectComponent* Current() const noexcept;
    // The design of the current project, or null when none is open.
    Design* CurrentDesign() const noexcept;
    // Counts every change of the current design (open, close, reload, edits that move objects),
    // so that derived data (timing results, floorplan views) can tell it is stale.
    uint64_t designEpoch = 0;
    // Called after the current design changed: prunes names that no longer exist, resets the view.
    void DesignChanged();

    // Counts every change of what a picture of the state shows: the design (open, reload, close,
    // import), the view, the highlight, the selection, the floorplan and the timing results. A
    // window compares it with the count it drew, so that it redraws after a change made through
    // any command word, the roots' and the objects' alike.
    uint64_t changes = 0;
    // Counts one change, and schedules `onChange` for the next idle pass unless it is pending
    // already: however many changes a script makes, the script runs once after them.
    void Changed();
    Script::TclObjRef onChange;   // the script run after changes; empty: none
    bool onChangePending = false;

    SettingTable settings;   // global settings
    ViewState view;
    std::map<std::string, std::string> highlight;  // object -> colour
    SettingTable highlightSettings;
    std::vector<std::string> selection;             // in the order of selecting
    SettingTable selectionSettings;
    std::map<std::string, std::vector<std::string>, std::less<>> collections;

    // Filled by the timing analysis and the floorplan in their own files.
    std::shared_ptr<TimingData> timing;
    std::shared_ptr<FloorplanData> floorplan;

    // Forgets the interpreter and releases everything the state holds, so that no component keeps the
    // state or a design alive through a cycle; called when the interpreter goes.
    void Shutdown();
};

using StatePtr = std::shared_ptr<ToolState>;

// The tool state of an interpreter (made by Kelmartool_Init), or null.
StatePtr StateOf(Tcl_Interp* interp);

// Resolves a collection value: the name of a collection, or a list of object names of the current
// design. False with `error` set, and the error code of the refusal (SetRefusal), when a name is
// unknown, the value is no list or no project is open.
bool ResolveObjects(const ToolState& state, Tcl_Obj* value, std::vector<std::string>& names, std::string& error);
// The same names without a copy: the collection's own list when the value names one, else `own`
// filled; null after setting `error`. The list stays valid until the collections change.
const std::vector<std::string>* ResolveView(const ToolState& state, Tcl_Obj* value, std::vector<std::string>& own,
                                            std::string& error);

// The text every design operation fails with when no project is open.
inline constexpr const char* kNoProject = "no project is open: open one with projmgr Open FILE msgVar";
// The text every operation fails with once the interpreter of the state is gone.
inline constexpr const char* kStateGone = "the tool state of this interpreter is gone";

// False, with kStateGone in `message`, once the interpreter of `state` is gone.
bool Alive(const ToolState& state, Port_String& message);

// The kinds of refusal a script tells apart without reading the text: the error code
// {KELMAR TOOL <kind> ...} that an operation sets on the state's interpreter before it gives failure,
// and that the package hands on with the failure text.
enum class Refusal {
    NoProject,  // NOPROJECT: no project is open
    Unknown,    // UNKNOWN <what> <name>: a name that names nothing of its kind
    File,       // FILE <file>: a file cannot be read, understood or written
    State,      // STATE: the command does not fit what is open or done now
    Limit,      // LIMIT: the answer would pass one of the tool's limits
    Value,      // VALUE: an argument the command does not take
    Script,     // SCRIPT <code>: a script's code that cannot leave the body the tool runs
    NoDisplay,  // NODISPLAY: a picture that needs Tk, which cannot be loaded (no display)
};

// Sets the error code {KELMAR TOOL <kind> <more>...} on the state's interpreter, while it has one.
void SetRefusal(const ToolState& state, Refusal kind, std::initializer_list<std::string_view> more = {});
// Gives 0 with `text` as the failure text, after setting the error code of `kind`.
CommonI::RESULT Refuse(const ToolState& state, Port_String& message, Refusal kind, const std::string& text);
CommonI::RESULT Refuse(const ToolState& state, Port_String& message, Refusal kind,
                       std::initializer_list<std::string_view> more, const std::string& text);

// The analyses and the floorplan of the state, made in timing.cpp and floorplan.cpp; each answers
// through the counted interface with no reference taken yet.
TcltaskI::ITimingAnalysis* NewTimingAnalysis(const StatePtr& state);
TcltaskI::IXFloorplan* NewFloorplan(const StatePtr& state);

}  // namespace kelmartool
