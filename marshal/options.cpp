#include "marshal/options.h"

#include <cstring>

#include "CitP/Factory.h"
#include "Port/MsgData.h"
#include "package/report.h"

namespace TcltaskI {

namespace {

Port_String Translate(const char* format, const char* a, const char* b = nullptr) {
    const Port::MsgData data("TclTasksI", "ERROR");
    return data.TranslateMsg(format, a, b);
}

// The names of a list from First until IsDone, each written as prefix, dash, name, suffix.
void AppendNames(Port_String& text, IOptionNameList* list, const char* prefix, const char* suffix) {
    CommonI::RefCountPtr<IOptionNameIterator> names;
    if (list->GetIterator(names) != 1 || !names) return;
    for (names->First(); !names->IsDone(); names->Next()) {
        text += prefix;
        text += names->Current();
        text += suffix;
    }
}

// The operation's name: the second word of the signature literal ("new_" for new of a highlight).
Port_String OperationName(const char* signature) {
    const char* start = std::strchr(signature, ' ');
    start = start != nullptr ? start + 1 : signature;
    const char* end = std::strchr(start, ' ');
    return Port_String(start, static_cast<int32_t>(end != nullptr ? end - start : std::strlen(start)));
}

}  // namespace

MatchSession::~MatchSession() {
    m_matcher.Release();
    m_valid.Release();
    m_matches.Release();
}

bool RequestComponentLibraries() {
    static const Port_String kSupport("libTcltask_Support");
    static const Port_String kArgMatch("libArgMatchKit");
    return CitP::Factory::LoadLibraryFactory(kSupport) && CitP::Factory::LoadLibraryFactory(kArgMatch);
}

int MatchSession::SetUp(Tcl_Interp* interp, const Option* options, size_t count) {
    const bool loaded = RequestComponentLibraries();
    m_matcher = CommonI::RefCountPtr<ICmdArgMatcher>(CitP::Factory::CreateInstanceRef(CmdArgMatcherID));
    m_matches = CommonI::RefCountPtr<IOptionNameList>(CitP::Factory::CreateInstanceRef(OptionNameListID));
    m_valid = CommonI::RefCountPtr<IOptionNameList>(CitP::Factory::CreateInstanceRef(OptionNameListID));
    if (!loaded || !m_matcher || !m_matches || !m_valid)
        return ReportWithoutReset(interp, "Error loading command argument matcher component library or while "
                                          "creating the command matcher component.");
    for (size_t i = 0; i < count; ++i) m_valid->Add(Port_String(options[i].name));
    return 0;
}

Tcl_Obj* OptionWord::GetTclObj() {
    if (!m_made) {
        SetObj(Tcl_NewStringObj(m_text.c_str(), m_text.Length()));
        m_made = true;
    }
    return TclObjHandleBase::GetTclObj();
}

Script::Handle* MatchSession::MakeWord(const Port_String& name) {
    if (m_wordsMade < kInlineWords) return &m_inlineWords[m_wordsMade++].emplace(name);
    m_heapWords.push_back(std::make_unique<OptionWord>(name));
    return m_heapWords.back().get();
}

int MatchSession::Pass(Tcl_Interp* interp, int argc, Script::Handle* const* argv, int firstOption) {
    if (argc > kInlineWords) {
        m_heapSlots.resize(static_cast<size_t>(argc));
        m_slots = m_heapSlots.data();
    }
    for (int i = 0; i < argc; ++i) {
        const char* text = argv[i]->GetString();
        if (i < firstOption || text == nullptr || text[0] != '-') {
            m_slots[i] = argv[i];
            continue;
        }
        const Port_String typed(text + 1);  // the name without its one leading dash
        CommonI::RefCountPtr<IOptionNameIterator> candidates;
        if (m_valid->GetIterator(candidates) != 1 || !candidates) return MatcherFailure(interp, typed);
        CommonI::RESULT matched;
        {
            CommonI::RefCountPtr<IOptionNameSource> source(candidates);
            matched = m_matcher->Match(typed, source, m_matches);
        }
        if (matched != 1 || !m_matches) return MatcherFailure(interp, typed);
        const int32_t found = m_matches->Size();
        if (found == 0) return NoMatch(interp, typed, text);
        if (found > 1) return Ambiguous(interp, typed, text);
        CommonI::RefCountPtr<IOptionNameIterator> match;
        m_matches->GetIterator(match);
        match->First();
        const Port_String name = match->Current();
        // A name typed in full is its own rewriting: the word stays as it came.
        m_slots[i] = name == typed ? argv[i] : MakeWord(name);
    }
    return 0;
}

int MatchSession::NoMatch(Tcl_Interp* interp, const Port_String& typed, const char* word) {
    m_refusal = kOptionUnknown;
    m_refused = word;
    Port_String text = Translate("Optional argument '%s' does not match with any of valid optional arguments.\n"
                                 "Please specify one of the following options\n",
                                 typed.c_str());
    AppendNames(text, m_valid.get(), "   -", "\n");
    return ReportWithoutReset(interp, text);
}

int MatchSession::MatcherFailure(Tcl_Interp* interp, const Port_String& typed) {
    m_refusal = nullptr;
    return ReportWithoutReset(interp, Translate("Error matching optional argument '%s'\n", typed.c_str()));
}

// The candidates are put together for the message's arguments, which its format does not show.
int MatchSession::Ambiguous(Tcl_Interp* interp, const Port_String& typed, const char* word) {
    m_refusal = kOptionAmbiguous;
    m_refused = word;
    Port_String candidates;
    AppendNames(candidates, m_matches.get(), " \"-", "\" ");
    return ReportWithoutReset(interp, Translate("Ambiguous optional argument 'errors\n", typed.c_str(), candidates.c_str()));
}

// The matcher or its lists failing is a component's fault, not a fault of the word typed.
int MatchSession::SetPassFailureCode(Tcl_Interp* interp, const char* interfaceName, const char* word) const {
    if (m_refusal == nullptr) return SetFailureCode(interp, Failure::Loader, interfaceName, word);
    return SetFailureCode(interp, Failure::Option, interfaceName, word, m_refusal, m_refused);
}

int FindOption(const char* name, const Option* options, size_t count) {
    for (size_t i = 0; i < count; ++i)
        if (std::strcmp(name, options[i].name) == 0) return static_cast<int>(i);
    return -1;
}

int PositionalScan(int argc, Script::Handle* const* words, const Option* options, size_t count) {
    for (int i = 2; i < argc; ++i) {
        const char* text = WordText(words[i]);
        if (text[0] == '-' && FindOption(text + 1, options, count) >= 0) return i;
    }
    return argc;
}

int ReportDefaultFailure(Tcl_Interp* interp, const char* name, const char* typeWord, const char* interfaceName,
                         const char* command) {
    ErrorReport(interp, Port_String("\nFailure(s) took place while retrieving the default value for ",
                                    "\noptional argument '", name, "' of type '", typeWord, "'"));
    return SetFailureCode(interp, Failure::Default, interfaceName, command, Port_String("-", name).c_str());
}

int ReportExpectsValue(Tcl_Interp* interp, const char* name, const char* typeWord, const char* interfaceName,
                       const char* command) {
    ErrorReport(interp, Port_String("\nOptional argument '", name, "' of type '", typeWord, "' expects a value"));
    return SetFailureCode(interp, Failure::Option, interfaceName, command, kOptionNoValue,
                          Port_String("-", name).c_str());
}

int ReportNotASwitch(Tcl_Interp* interp, const char* word, CitI::IInterface* object, const char* signature,
                     const char* interfaceName, const char* command) {
    // A copy of the word: the help may run code of its own before the code is set.
    const Port_String typed(word);
    ErrorReportWithHelp(
        interp, Port_String("The current argument \"", word, "\" is not an optional argument switch as expected."),
        object, OperationName(signature).c_str());
    return SetFailureCode(interp, Failure::Option, interfaceName, command, kOptionNotSwitch, typed.c_str());
}

int ReportUnrecognized(Tcl_Interp* interp, const char* name, CitI::IInterface* object, const char* signature,
                       const char* interfaceName, const char* command) {
    const Port_String typed("-", name);
    ErrorReportWithHelp(interp, Port_String("Unrecognized optional argument \"", typed.c_str(), "\""), object,
                        OperationName(signature).c_str());
    return SetFailureCode(interp, Failure::Option, interfaceName, command, kOptionUnknown, typed.c_str());
}

}  // namespace TcltaskI
