# The hand-written parts of the command reference (docs/commands.md): for every command, how it
# fails and one example. docs/reference/generate.tcl reads this file and adds what the code says.
#
#   intro TEXT                       the text under the title
#   failures TEXT ERRORS             the section on failures every command shares
#   entry ROOT WORD {fails TEXT ?after SCRIPT? example SCRIPT ?errors SCRIPT?}
#   common WORD {synopsis S does D returns R fails TEXT ?after SCRIPT? example SCRIPT ?errors SCRIPT?}
#
# TEXT is markdown; it follows "Fails" as the rest of a sentence. An example runs in kelmarsh on a
# copy of examples/designs/counter.json, one command a step, and every step must succeed; the
# steps of `after` run first and are named, not shown with their answers (`floorplan open`). Then the
# ERRORS steps run in the same shell, and every one must fail: raise an error, or answer 0 as the
# project commands answer a failure (a step `set VAR` that shows the reason is allowed too). The
# reference shows every step with what it answered.

intro {
Every command of the eleven root objects of the reference tool, in table order: its synopsis, its
options with their defaults, what it returns, how it fails, and an example. The synopsis and what a
command does and returns are the tool's help (`kelmartool::help ROOT WORD`); the words, counts,
options and defaults are those of the package's command tables. The [README](../README.md) says
how the package and the tool are used from a script.

Each example ran in `kelmarsh -project counter.json`, on a copy of `examples/designs/counter.json`
in an empty folder, and shows what every step answered (`error:` for an error). The folder's path
is shown as `.`. The roots are imported, as kelmarsh imports them, so `collection` stands for
`::kelmartool::collection`; the object words such as `::kelmar::IHDProject12` are those of a fresh
shell.
}

failures {
The package checks the words of a call before the tool sees it: the command word, the number of
positionals, the option names and the values of boolean and integer words. A call that does not
fit raises an error with one of the messages below and reaches no operation. The wrong-count
message of the project classes and of the view names the operation's signature; the others ask
for `help` with the object's word, which kelmarsh answers (`help ICollection3 get` is
`help collection get`). An ambiguous abbreviation of an option gives a message that does not list
the candidates.

Then the operation decides. The project classes (`projmgr` and `project`) answer 0 and put the
reason into their `msgVar`; every other command raises an error whose message is the tool's text.
A command that fails leaves the design, its files and the tool's settings as they were (what the
body of a `collection foreach` did before it failed stays done). Without an open project the
commands that need a design fail with `no project is open: open one with projmgr Open FILE msgVar`.
} {
    collection nosuch
    collection get
    project Sync
    view zoom -inn
    collection equal {r0 r1} {r1 r0} -ordered
    search search r* -e
    collection equal {r0 r1} {r1 r0} -order maybe
    search search r* -type
    collection index {r0 r1} two
    obj get nosuch site
    projmgr Open nosuch.json msg
    set msg
}

common GetInterface {
    synopsis {OBJECT GetInterface ID}
    does {gives the object behind OBJECT under the interface ID, an identifier such as
        `$::kelmar::TcltaskI::ITclProjectID`}
    returns {its word for that interface, or 0 when the object does not offer it}
    fails {never: an identifier the object does not offer, or a word that is no identifier, gives 0.
        Every object answers it, the root objects and every object they hand out.}
    example {
        set hd [project GetHDProject]
        [$hd GetInterface $::kelmar::TcltaskI::ITclProjectID] GetFileName
    }
    errors {
        collection GetInterface $::kelmar::TcltaskI::ISelectionID
    }
}

# --- projmgr ---------------------------------------------------------------------------------------

entry projmgr Open {
    fails {when the file cannot be read or holds no design the tool can take (bad JSON, a value out of
        range, a name used twice): the reason is in msgVar and the open projects stay as they were.
        Opening a file that is open already reads it again and makes it the current project.}
    example {
        projmgr Open counter.json msg
        set msg
    }
    errors {
        projmgr Open nosuch.json msg
        set msg
    }
}

entry projmgr OpenWithHelper {
    fails {as `projmgr Open` does. HELPER is the word of a project helper, such as
        `project GetProjectHelper` gives, or 0 for none.}
    example {
        projmgr OpenWithHelper counter.json [project GetProjectHelper] msg
        set msg
    }
    errors {
        projmgr OpenWithHelper "" 0 msg
        set msg
    }
}

entry projmgr Close {
    fails {when no open project has the file FILE; the name is compared as a full path, so a relative
        name and the full one close the same project.}
    example {
        projmgr Close counter.json msg
        set msg
        project GetFileName
    }
    errors {
        projmgr Close counter.json msg
        set msg
    }
}

entry projmgr CloseCurrent {
    fails {when no project is open. The project opened before the current one becomes current.}
    example {
        projmgr CloseCurrent msg
        set msg
    }
    errors {
        projmgr CloseCurrent msg
        set msg
    }
}

entry projmgr GetCurrentTclProject {
    fails {when no project is open; projectVar is then set to 0.}
    example {
        projmgr GetCurrentTclProject current msg
        $current GetFileName
        projmgr CloseCurrent msg
    }
    errors {
        projmgr GetCurrentTclProject current msg
        set msg
    }
}

entry projmgr GetCurrentHDProject {
    fails {when no project is open; projectVar is then set to 0.}
    example {
        projmgr GetCurrentHDProject hd msg
        set hd
        projmgr CloseCurrent msg
    }
    errors {
        projmgr GetCurrentHDProject hd msg
        set msg
    }
}

entry projmgr GetCurrentProjectHelper {
    fails {when no project is open; helperVar is then set to 0.}
    example {
        projmgr GetCurrentProjectHelper helper msg
        set helper
        projmgr CloseCurrent msg
    }
    errors {
        projmgr GetCurrentProjectHelper helper msg
        set msg
    }
}

entry projmgr SyncCurrent {
    fails {when no project is open or the file cannot be written; a failed write leaves the file as it
        was. A file that holds the design already is not written.}
    example {
        projmgr SyncCurrent msg
        set msg
        projmgr CloseCurrent msg
    }
    errors {
        projmgr SyncCurrent msg
        set msg
    }
}

entry projmgr ReloadCurrent {
    fails {when no project is open or the file cannot be read as a design; the design in memory then
        stays as it was.}
    example {
        projmgr ReloadCurrent msg
        set msg
        file delete counter.json
    }
    errors {
        projmgr ReloadCurrent msg
        set msg
    }
}

# --- project ---------------------------------------------------------------------------------------

entry project OpenWithHelper {
    fails {as `projmgr OpenWithHelper` does: `project` always stands for the current project, and
        opening through it makes FILE the current project.}
    example {
        project OpenWithHelper counter.json 0 msg
        set msg
    }
    errors {
        project OpenWithHelper nosuch.json 0 msg
        set msg
    }
}

entry project Close {
    fails {when no project is open: it answers 0.}
    example {
        project Close
        project GetFileName
    }
    errors {
        project Close
    }
}

entry project GetFileName {
    fails {never: with no project open it answers the empty string.}
    example {
        project GetFileName
    }
}

entry project GetHDProject {
    fails {when no project is open: it answers 0.}
    example {
        set hd [project GetHDProject]
        [$hd GetInterface $::kelmar::TcltaskI::ITclProjectID] GetFileName
        project Close
    }
    errors {
        project GetHDProject
    }
}

entry project GetProjectHelper {
    fails {when no project is open: it answers 0.}
    example {
        project GetProjectHelper
        project Close
    }
    errors {
        project GetProjectHelper
    }
}

entry project Sync {
    fails {when no project is open or the file cannot be written. The text is formatted and checked
        first and then replaces the file through a new file beside it, so a failed write leaves the
        file as it was; only the values that differ are changed, the file's layout stays.}
    example {
        project Sync msg
        set msg
        project Close
    }
    errors {
        project Sync msg
        set msg
    }
}

entry project Reload {
    fails {when no project is open or the file cannot be read as a design; the design in memory then
        stays as it was.}
    example {
        project Reload msg
        set msg
        file delete counter.json
    }
    errors {
        project Reload msg
        set msg
    }
}

entry project RegisterComponent {
    fails {when ID is no identifier, the variable holds no object, or no project is open: it answers
        0. The component is kept on the project until it is unregistered or the project closes.}
    example {
        set query [obj GetInterface c569a982-87c5-4d45-8a2c-17b796723bdc]
        project RegisterComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e query
        project GetComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e
    }
    errors {
        project RegisterComponent not-an-identifier query
        project RegisterComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e nosuch
    }
}

entry project UnRegisterComponent {
    fails {when the object of the variable is not kept on the project: it answers 0. The object is
        found under any of its interfaces.}
    example {
        set query [obj GetInterface c569a982-87c5-4d45-8a2c-17b796723bdc]
        project RegisterComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e query
        project UnRegisterComponent query
    }
    errors {
        project UnRegisterComponent query
    }
}

entry project GetComponent {
    fails {when nothing is kept under ID: it answers 0.}
    example {
        set query [obj GetInterface c569a982-87c5-4d45-8a2c-17b796723bdc]
        project RegisterComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e query
        project GetComponent 5d1e4b7a-2c3f-4e8a-9b6d-0f1a2b3c4d5e
    }
    errors {
        project GetComponent 00000000-0000-0000-0000-000000000001
    }
}

# --- collection ------------------------------------------------------------------------------------

entry collection append_to {
    fails {when NAME is empty or names a design object, or an object is unknown; the collection then
        stays as it was. OBJECTS are object names, lists of them or collections; a new NAME makes a
        new collection.}
    example {
        collection append_to regs r0 r1
        collection append_to regs r1 clkbuf -unique
    }
    errors {
        collection append_to regs nosuch
        collection append_to r0 r1
    }
}

entry collection equal {
    fails {when a word is neither a collection nor a list of known objects. Each of COLL1 and COLL2
        is a collection's name or a list of objects.}
    example {
        collection set regs {r0 r1}
        collection equal regs {r1 r0}
        collection equal regs {r1 r0} -order_dependent
    }
    errors {
        collection equal regs {r1 nosuch}
    }
}

entry collection copy {
    fails {when COLL is neither a collection nor a list of known objects.}
    example {
        collection set regs {r0 r1}
        collection copy {regs clkbuf}
    }
    errors {
        collection copy nosuch
    }
}

entry collection foreach {
    fails {when COLL is neither a collection nor a list of known objects, or BODY fails: the error of
        the body is the error of the command. `break` ends the walk and `continue` goes on; `return`
        cannot leave the body and fails the walk.}
    example {
        collection foreach cell {u_inc0 u_inc1} { puts "$cell on [obj get $cell site]" }
    }
    errors {
        collection foreach cell {u_inc0 u_inc1} { error "stopped at $cell" }
        collection foreach cell {u_inc0 u_inc1} { return }
    }
}

entry collection index {
    fails {when POSITION is not an integer or lies outside the collection, or COLL is neither a
        collection nor a list of known objects.}
    example {
        collection set logic {u_inc0 u_inc1 u_carry}
        collection index logic 2
    }
    errors {
        collection index logic 3
        collection index logic last
    }
}

entry collection remove_from {
    fails {when NAME is no collection or an object is unknown. An object the collection does not hold
        is no failure.}
    example {
        collection set regs {r0 r1 clkbuf}
        collection remove_from regs clkbuf
    }
    errors {
        collection remove_from nosuch r0
    }
}

entry collection sizeof {
    fails {when COLL is neither a collection nor a list of known objects.}
    example {
        collection set regs {r0 r1}
        collection sizeof regs
        collection sizeof {regs clkbuf}
    }
    errors {
        collection sizeof nosuch
    }
}

entry collection set {
    fails {when NAME is empty or names a design object, or an object is unknown.}
    example {
        collection set outputs {q0 q1 carry}
    }
    errors {
        collection set outputs {q0 nosuch}
        collection set q0 {q1}
    }
}

entry collection get {
    fails {when NAME is no collection.}
    example {
        collection set regs {r0 r1}
        collection get regs
    }
    errors {
        collection get nosuch
    }
}

entry collection properties {
    fails {never while the tool is loaded. When the current design changes, the collections lose the
        objects it does not have; with no project open there are none.}
    example {
        collection set regs {r0 r1}
        collection set outputs {q0 q1 carry}
        collection properties
    }
}

# --- settings --------------------------------------------------------------------------------------

entry settings set {
    fails {when VALUE does not fit the setting's type or range. A NAME that is no built-in setting
        makes a setting of the script's own, which takes any value.}
    example {
        settings set max_paths 3
        settings set my_note "set by a script"
    }
    errors {
        settings set max_paths many
        settings set zoom_factor 0.5
    }
}

entry settings unset {
    fails {when NAME is no setting.}
    example {
        settings set max_paths 3
        settings unset max_paths
    }
    errors {
        settings unset nosuch
    }
}

entry settings get {
    fails {when NAME is no setting.}
    example {
        settings get zoom_factor
    }
    errors {
        settings get nosuch
    }
}

entry settings properties {
    fails {never while the tool is loaded.}
    example {
        settings properties
    }
}

# --- obj -------------------------------------------------------------------------------------------

entry obj name {
    fails {when OBJECT is unknown or stands for more or fewer than one object: OBJECT may be a
        collection or a list that holds exactly one.}
    example {
        collection set first {r0}
        obj name first
    }
    errors {
        obj name {r0 r1}
        obj name nosuch
    }
}

entry obj type {
    fails {as `obj name` does.}
    example {
        obj type r0
        obj type X3Y2
        obj type bank_west
    }
    errors {
        obj type nosuch
    }
}

entry obj get {
    fails {when OBJECT is not one known object or has no property PROPERTY.}
    example {
        obj get r0 cell_type
        obj get q0_n loads
    }
    errors {
        obj get r0 colour
    }
}

entry obj properties {
    fails {as `obj name` does.}
    example {
        obj properties sys_clk
        lindex [obj properties sys_clk -descriptors] 0
    }
    errors {
        obj properties nosuch
    }
}

# --- view ------------------------------------------------------------------------------------------

entry view zoom {
    fails {when more than one of `-full`, `-selection`, `-last`, `-name` and `-range` is given, or
        more than one of `-in`, `-out` and `-detailed`; when an option's numbers are not as many as
        shown or lie beyond a billion; when `-name` is no placed object or the selection holds none;
        or when there is no earlier view for `-last`. The viewport is kept on the device; a new one
        is added to the history.}
    example {
        view zoom -full
        view zoom -name bank_east
        view zoom -in
    }
    errors {
        view zoom -full -name r0
        view zoom -range {2 2 6}
        view zoom -selection
    }
}

entry view pan {
    fails {when two opposite directions are given, `-percentage` is no number above 0 and at most
        1000, `-delta` is not two numbers, or `-name` is no placed object. Without `-percentage` a
        pan moves by the setting pan_percentage of `settings`.}
    example {
        view zoom -range {2 2 6 6}
        view pan -right -percentage 25
        view pan -farleft -top
    }
    errors {
        view pan -left -right
        view pan -up -percentage 0
    }
}

entry view next {
    fails {when the view shown is the last of the history.}
    example {
        view zoom -in
        view previous
        view next
    }
    errors {
        view next
    }
}

entry view previous {
    fails {when the view shown is the first of the history.}
    example {
        view zoom -in
        view previous
    }
    errors {
        view previous
    }
}

# --- highlight -------------------------------------------------------------------------------------

entry highlight add {
    fails {when COLOR is no colour name or `#rrggbb`, an object is unknown, or the highlight would hold
        more than its setting max_items; the highlight then stays as it was. The default of `-color`
        asks a global command `highlight` anew on every call, as kelmarsh imports it; where there
        is none, a call without `-color` fails with "Failure(s) took place while retrieving the
        default value for optional argument 'color' of type 'string'".}
    example {
        highlight add r0 r1
        highlight add q0_n -color #ff8800
        highlight current
    }
    errors {
        highlight add r0 -color mauve
        highlight add nosuch
    }
}

entry highlight remove {
    fails {when an object is unknown. An object that is not highlighted is no failure.}
    example {
        highlight add r0 r1 carry
        highlight remove carry
    }
    errors {
        highlight remove nosuch
    }
}

entry highlight new {
    fails {as `highlight add` does. Without `-color` the objects take the setting
        default_highlight_color.}
    example {
        highlight add r0
        highlight new {u_inc0 u_inc1} -color green
        highlight current
    }
    errors {
        highlight new r0 -color nocolour
    }
}

entry highlight current {
    fails {never while the tool is loaded.}
    example {
        highlight add r0 -color red
        highlight current
    }
}

entry highlight clear {
    fails {never while the tool is loaded.}
    example {
        highlight add r0 r1
        highlight clear
        highlight current
    }
}

entry highlight set {
    fails {when NAME is no highlight setting or VALUE does not fit its type.}
    example {
        highlight set default_highlight_color cyan
        highlight add carry
        highlight current
    }
    errors {
        highlight set default_highlight_color nocolour
        highlight set nosuch 1
    }
}

entry highlight get {
    fails {when NAME is no highlight setting. It answers without an open project, for the default of
        `highlight add -color`.}
    example {
        highlight get default_highlight_color
    }
    errors {
        highlight get nosuch
    }
}

entry highlight properties {
    fails {never while the tool is loaded.}
    example {
        highlight properties
        lindex [highlight properties -descriptors] 1
    }
}

# --- selection -------------------------------------------------------------------------------------

entry selection add {
    fails {when an object is unknown, the setting filter does not admit its kind, or the selection
        would hold more than its setting max_items; the selection then stays as it was. An object
        already selected keeps its place.}
    example {
        selection add r0 r1
        selection add {q0 r0}
        selection set filter cell
    }
    errors {
        selection add nosuch
        selection add clk
    }
}

entry selection remove {
    fails {when an object is unknown. An object that is not selected is no failure.}
    example {
        selection add r0 r1 q0
        selection remove r1
    }
    errors {
        selection remove nosuch
    }
}

entry selection new {
    fails {as `selection add` does.}
    example {
        selection add q0
        selection new r0 r1
    }
    errors {
        selection new r0 nosuch
    }
}

entry selection current {
    fails {never while the tool is loaded.}
    example {
        selection add r1 r0
        selection current
    }
}

entry selection clear {
    fails {never while the tool is loaded.}
    example {
        selection add r0 r1
        selection clear
        selection current
    }
}

entry selection set {
    fails {when NAME is no selection setting or VALUE does not fit it.}
    example {
        selection set filter cell
        selection set max_items 2
    }
    errors {
        selection set filter wire
        selection set nosuch 1
    }
}

entry selection get {
    fails {when NAME is no selection setting.}
    example {
        selection get filter
    }
    errors {
        selection get nosuch
    }
}

entry selection properties {
    fails {never while the tool is loaded.}
    example {
        selection properties
        lindex [selection properties -descriptors] 0
    }
}

# --- search ----------------------------------------------------------------------------------------

entry search search {
    fails {when `-exactmatch` and `-regexp` (or `-exp`) are both given, a `-type` or `-in` word is
        unknown, the regular expression is bad, or a walk over the sites of a very large device would
        test more than ten million of them. The search is case-blind unless `-matchcase`; the
        setting search_limit of `settings` caps the hits.}
    example {
        search search u_*
        search search Q* -type port
        search search {^r[0-9]$} -regexp
        search search clk -exactmatch -type net -type clock
    }
    errors {
        search search x -type wire
        search search {(} -regexp
        search search x -exactmatch -regexp
    }
}

# --- timing ----------------------------------------------------------------------------------------

entry timing properties {
    fails {never while the tool is loaded.}
    example {
        timing new setup
        timing properties
        lindex [timing properties -descriptors] 3
    }
}

entry timing delete {
    fails {when there is no analysis ANALYSIS.}
    example {
        timing new setup
        timing new hold
        timing delete setup
    }
    errors {
        timing delete setup
    }
}

entry timing disable_constraints {
    fails {when there is no analysis ANALYSIS or it has no such constraint; then nothing changes.}
    after {
        timing new setup
    }
    example {
        timing set_constraint setup input_delay 0.5
        timing disable_constraints setup input_delay
    }
    errors {
        timing disable_constraints setup uncertainty
    }
}

entry timing disable_cpt {
    fails {when there is no analysis ANALYSIS, KIND is not cell, port, net or clock, or an item is no
        object of that kind.}
    after {
        timing new setup
    }
    example {
        timing disable_cpt setup cell u_carry
    }
    errors {
        timing disable_cpt setup cell nosuch
        timing disable_cpt setup site X0Y0
    }
}

entry timing enable_constraints {
    fails {as `timing disable_constraints` does.}
    after {
        timing new setup
    }
    example {
        timing set_constraint setup input_delay 0.5
        timing disable_constraints setup input_delay
        timing enable_constraints setup input_delay
    }
    errors {
        timing enable_constraints setup period:sys_clk
    }
}

entry timing get {
    fails {when there is no analysis ANALYSIS or NAME is none of its settings and results; the message
        lists them.}
    after {
        timing new setup
    }
    example {
        llength [timing run setup]
        timing get setup worst_slack
        timing get setup status
    }
    errors {
        timing get setup slack
    }
}

entry timing enable_cpt {
    fails {as `timing disable_cpt` does.}
    after {
        timing new setup
    }
    example {
        timing disable_cpt setup cell u_carry u_inc1
        timing enable_cpt setup cell u_carry
    }
    errors {
        timing enable_cpt setup net r0
    }
}

entry timing new {
    fails {when ANALYSIS is empty or more than one word, or an analysis of that name exists already.
        Without `-name` the display name is ANALYSIS.}
    example {
        timing new setup -name "counter at 100 MHz"
        timing get setup name
    }
    errors {
        timing new setup
        timing new "two words"
    }
}

entry timing reset {
    fails {when there is no analysis ANALYSIS. Its name and description stay; its constraints, the
        items left out of path tracing, its endpoints, queries, filters and result are dropped.}
    after {
        timing new setup
    }
    example {
        timing set_constraint setup period:sys_clk 4.5
        timing reset setup
    }
    errors {
        timing reset hold
    }
}

entry timing run {
    fails {when there is no analysis ANALYSIS or no project is open, or the analysis has a result and
        `-overwrite` is not given. The setting max_paths of `settings` caps the paths reported.}
    after {
        timing new setup
    }
    example {
        settings set max_paths 2
        timing run setup
        timing set_constraint setup period:sys_clk 4.5
        timing run setup -overwrite
    }
    errors {
        timing run setup
    }
}

entry timing save_as {
    fails {when there is no analysis ANALYSIS, it has not run, FILE is empty, or the file cannot be
        written; a failed write leaves the file as it was.}
    after {
        timing new setup
    }
    example {
        llength [timing run setup]
        timing save_as setup setup.rpt
        lrange [split [read [set f [open setup.rpt]]][close $f] \n] 0 5
        timing new hold
    }
    errors {
        timing save_as setup nosuch/setup.rpt
        timing save_as hold hold.rpt
    }
}

entry timing saveas {
    fails {as `timing save_as` does; both write the same report.}
    after {
        timing new setup
    }
    example {
        llength [timing run setup]
        timing saveas setup setup.rpt
    }
    errors {
        timing saveas setup ""
    }
}

entry timing set {
    fails {when there is no analysis ANALYSIS, NAME is a read-only setting or none at all, or the name
        would be empty. Only name and description can be set.}
    after {
        timing new setup
    }
    example {
        timing set setup description "the counter at its clock"
        timing get setup description
    }
    errors {
        timing set setup status done
        timing set setup name ""
    }
}

entry timing set_constraint {
    fails {when there is no analysis ANALYSIS, NAME is none of period:CLOCK, input_delay,
        input_delay:PORT, output_delay, output_delay:PORT, uncertainty and reference_clock, its clock
        or port is not in the design, or VALUE is no number in range. A constraint set again is
        enabled again.}
    after {
        timing new setup
    }
    example {
        timing set_constraint setup period:sys_clk 4.5
        timing set_constraint setup output_delay:carry 1
    }
    errors {
        timing set_constraint setup period:nosuch 4.5
        timing set_constraint setup period:sys_clk -1
        timing set_constraint setup slew 1
    }
}

entry timing set_endpoints {
    fails {when there is no analysis ANALYSIS, the kind is not from or to, the side not only or
        except, an item is no start point (from: input ports and sequential cells) or end point (to:
        output ports and sequential cells), or only is given no item. No item with except drops the
        rule.}
    after {
        timing new setup
    }
    example {
        timing set_endpoints setup to only q0 q1
        timing run setup
    }
    errors {
        timing set_endpoints setup from only q0
        timing set_endpoints setup to just q0
    }
}

entry timing set_query {
    fails {when there is no analysis ANALYSIS, the kind is not paths or fanout, no item is given, a
        paths item is no field of a path (or `*`), `-ld` or `-hf` is negative, or a fanout query has
        no `-hf`. A paths query chooses the fields of each reported path; a fanout query reports the
        nets of at least `-hf` loads.}
    after {
        timing new setup
    }
    example {
        timing set_query setup paths startpoint endpoint slack
        timing set_query setup fanout * -hf 3
        timing run setup
        timing get setup high_fanout
    }
    errors {
        timing set_query setup fanout *
        timing set_query setup paths margin
    }
}

entry timing set_filter {
    fails {when there is no analysis ANALYSIS, KIND is not startpoint, endpoint, clock, through or
        slack, MODE is not include, exclude or clear (below, above or clear for slack), the slack
        filter is not given one number, or another filter no pattern.}
    after {
        timing new setup
    }
    example {
        timing set_filter setup startpoint include r*
        timing set_filter setup slack below 7
        timing run setup
    }
    errors {
        timing set_filter setup slack below soon
        timing set_filter setup cell include r0
    }
}

entry timing show_settings {
    fails {when there is no analysis ANALYSIS; the message lists the analyses.}
    example {
        timing new setup -name "counter at 100 MHz"
        timing show_settings setup
    }
    errors {
        timing show_settings hold
    }
}

# --- floorplan -------------------------------------------------------------------------------------

entry floorplan open {
    fails {when a floorplan is open already or no project is open. The floorplan is a working copy of
        the design's device, blocks, prohibited sites and port sites; the design changes only on
        `floorplan save` or `floorplan close`.}
    example {
        floorplan open
    }
    errors {
        floorplan open
    }
}

entry floorplan open_full {
    fails {as `floorplan open` does, and when FORM is not ucf, csv, vhdl or vlog, MODE not replace or
        merge, the file cannot be read, or its constraints do not fit the design; then no floorplan is
        open.}
    example {
        floorplan open
        floorplan group blk_out u_carry
        floorplan export -csv plan.csv
        floorplan close -nosave
        floorplan open_full plan.csv csv replace
        floorplan get blocks
        floorplan close -nosave
    }
    errors {
        floorplan open_full plan.csv xml replace
        floorplan open_full nosuch.csv csv merge
    }
}

entry floorplan open_empty {
    fails {as `floorplan open` does, and when a name is empty, a number is not a whole number in its
        range, or LAYOUT is not columns or rows. The banks split the device into equal stripes of
        columns or rows.}
    example {
        floorplan open_empty plan2 KX-16 4 4 2 columns 2 1 1
        floorplan close -nosave
    }
    errors {
        floorplan open_empty plan2 KX-16 4 4 9 columns 2 1 1
    }
}

entry floorplan close {
    fails {when no floorplan is open, or the save fails (as `floorplan save` fails); then it stays
        open.}
    after {
        floorplan open
    }
    example {
        floorplan prohibit X6Y6
        floorplan close
    }
    errors {
        floorplan close
    }
}

entry floorplan save {
    fails {when no floorplan is open, the design changed since it was opened, a block's region reaches
        beyond the device, or the file cannot be written; the file, the design and the floorplan then
        stay as they were.}
    after {
        floorplan open
    }
    example {
        floorplan prohibit X6Y6
        floorplan save
        floorplan save
        floorplan close -nosave
    }
    errors {
        floorplan save
    }
}

entry floorplan import {
    fails {when no floorplan is open, no file is given, a file cannot be read, or the constraints do
        not fit the design; then the floorplan stays as it was. The files' blocks and prohibited sites
        take the place of the floorplan's; ports they do not name keep their sites.}
    after {
        floorplan open
    }
    example {
        floorplan export -ucf plan.ucf
        floorplan import -ucf plan.ucf
    }
    errors {
        floorplan import
        floorplan import -csv nosuch.csv
    }
}

entry floorplan export {
    fails {when no floorplan is open, no file is given, or a file cannot be written. Every text is made
        before any file is written, and each file is replaced whole or not at all.}
    after {
        floorplan open
    }
    example {
        floorplan export -csv plan.csv -ucf plan.ucf
        lrange [split [read [set f [open plan.csv]]][close $f] \n] 0 3
    }
    errors {
        floorplan export
        floorplan export -csv nosuch/plan.csv
    }
}

entry floorplan group {
    fails {when no floorplan is open, BLOCK is not one word, CELLS names no object or an object that is
        no cell, or a cell is in another block. A block of that name gets the cells added.}
    after {
        floorplan open
    }
    example {
        floorplan group blk_out u_carry
    }
    errors {
        floorplan group blk_out r0
        floorplan group blk_out q0
    }
}

entry floorplan ungroup {
    fails {when no floorplan is open, no block is given, or one is no block.}
    after {
        floorplan open
    }
    example {
        floorplan group blk_out u_carry
        floorplan ungroup blk_out
    }
    errors {
        floorplan ungroup blk_out
    }
}

entry floorplan properties {
    fails {when no floorplan is open or the design changed since it was opened.}
    after {
        floorplan open
    }
    example {
        floorplan properties
        floorplan close -nosave
    }
    errors {
        floorplan properties
    }
}

entry floorplan get {
    fails {when NAME is none of open and the settings `floorplan properties` lists, or, but for open,
        no floorplan is open.}
    example {
        floorplan get open
        floorplan open
        floorplan get sso_limit
    }
    errors {
        floorplan get colour
    }
}

entry floorplan set {
    fails {when no floorplan is open, NAME is read-only or no setting, or VALUE does not fit. The
        settings that can be set are name, site_capacity, sso_limit (a number for every bank, or a
        dict of bank and number) and clock_limit.}
    after {
        floorplan open
    }
    example {
        floorplan set sso_limit {bank_west 3}
        floorplan set clock_limit 2
    }
    errors {
        floorplan set rows 3
        floorplan set sso_limit {bank_north 3}
    }
}

entry floorplan block_properties {
    fails {when no floorplan is open.}
    after {
        floorplan open
    }
    example {
        floorplan block_properties
        floorplan close -nosave
    }
    errors {
        floorplan block_properties
    }
}

entry floorplan block_get {
    fails {when no floorplan is open, a block is unknown, or NAME is neither a property nor a
        constraint of the block.}
    after {
        floorplan open
    }
    example {
        floorplan block_get blk_count region
        floorplan block_get blk_count cells
    }
    errors {
        floorplan block_get blk_count colour
        floorplan block_get blk_other region
    }
}

entry floorplan block_set_constraint {
    fails {when no floorplan is open, a block is unknown, NAME is not region, capacity or comment, or
        VALUE does not fit it (a region is `X0Y0:X3Y3` or four numbers).}
    after {
        floorplan open
    }
    example {
        floorplan group blk_out u_carry
        floorplan block_set_constraint blk_out region X4Y4:X4Y4
    }
    errors {
        floorplan block_set_constraint blk_out colour red
        floorplan block_set_constraint blk_out region X4Y4
    }
}

entry floorplan block_delete_constraint {
    fails {when no floorplan is open, a block is unknown, or a block has no such constraint.}
    after {
        floorplan open
    }
    example {
        floorplan block_set_constraint blk_count capacity 6
        floorplan block_delete_constraint blk_count capacity
    }
    errors {
        floorplan block_delete_constraint blk_count capacity
    }
}

entry floorplan prohibit {
    fails {when no floorplan is open, no site is given, a word is no site or range `X0Y0:X1Y1`, a site
        is not on the device, or more than a million sites would be prohibited.}
    after {
        floorplan open
    }
    example {
        floorplan prohibit {X4Y4 X6Y0:X6Y1}
    }
    errors {
        floorplan prohibit X9Y9
        floorplan prohibit {}
    }
}

entry floorplan allow {
    fails {as `floorplan prohibit` does, but for the limit. A site that is not prohibited is no
        failure.}
    after {
        floorplan open
    }
    example {
        floorplan prohibit {X4Y4 X6Y6}
        floorplan allow X4Y4:X5Y5
    }
    errors {
        floorplan allow here
    }
}

entry floorplan drc {
    fails {when no floorplan is open. The findings are rules broken, not failures: overlap,
        out_of_device, prohibited_site, outside_region and capacity.}
    after {
        floorplan open
    }
    example {
        floorplan drc
        floorplan prohibit X3Y3
        floorplan drc
        floorplan close -nosave
    }
    errors {
        floorplan drc
    }
}

entry floorplan sso_analysis {
    fails {when no floorplan is open.}
    after {
        floorplan open
    }
    example {
        floorplan sso_analysis
        floorplan close -nosave
    }
    errors {
        floorplan sso_analysis
    }
}

entry floorplan clock_analysis {
    fails {when no floorplan is open.}
    after {
        floorplan open
    }
    example {
        floorplan clock_analysis
        floorplan close -nosave
    }
    errors {
        floorplan clock_analysis
    }
}

entry floorplan make_pin_compatible {
    fails {when no floorplan is open, MODE is not copy or swap, the port lists differ in length or are
        empty, OFFSET is not two whole numbers (and `0 0` for swap), a port is named twice, is no port
        or not placed, or a port would leave the device, share a site or land on a prohibited site.}
    after {
        floorplan open
    }
    example {
        floorplan make_pin_compatible q0 q1 {0 0} swap
        floorplan make_pin_compatible q0 carry {0 1} copy
    }
    errors {
        floorplan make_pin_compatible q0 nosuch {0 0} swap
        floorplan make_pin_compatible q0 carry {1 0} copy
    }
}

entry floorplan zoom {
    fails {when no floorplan is open, a word is no site of the device, or the block is unknown or has
        no region.}
    after {
        floorplan open
    }
    example {
        floorplan zoom X2Y2 X4Y3
        floorplan zoom block blk_count
        floorplan zoom fit x
    }
    errors {
        floorplan zoom X2Y2 nowhere
        floorplan zoom block blk_other
    }
}

entry floorplan refresh {
    fails {when no floorplan is open. The view keeps only what still lies on the device.}
    after {
        floorplan open
    }
    example {
        floorplan zoom X2Y2 X4Y3
        floorplan refresh
        floorplan close -nosave
    }
    errors {
        floorplan refresh
    }
}
