// The option passes of the matched and switch frames that do not depend on a command's types: the
// matcher set-up, the matching pass, the positional scan and the texts of the option failures.
#pragma once

#include <tcl.h>

#include <memory>
#include <optional>
#include <vector>

#include "ArgMatch/ICmdArgMatcher.h"
#include "Script/Handle.h"
#include "marshal/declare.h"

namespace TcltaskI {

// An option word rewritten to the full name of the option it abbreviates. The option walk reads its
// text; a Tcl value is made only when one is asked for (a word taken as the value of the option
// before it).
class OptionWord final : public Script::TclObjHandleBase {
public:
    explicit OptionWord(const Port_String& name) { m_text.Append("-", 1).Append(name.c_str(), name.Length()); }
    Tcl_Obj* GetTclObj() override;
    const char* GetString() override { return m_text.c_str(); }

private:
    Port_String m_text;
    bool m_made = false;
};

// The matcher, its two name lists and the matched vector of one call. On destruction it gives back
// the matcher, the list of valid names and the list of matches, in that order, and frees the
// handles the matching pass made.
class MatchSession {
public:
    MatchSession() = default;
    MatchSession(const MatchSession&) = delete;
    MatchSession& operator=(const MatchSession&) = delete;
    ~MatchSession();

    // Requests the component libraries, makes the matcher and the lists, and adds the option names.
    // 0, or 1 after the loader failure has been reported.
    int SetUp(Tcl_Interp* interp, const Option* options, size_t count);
    // Fills the matched vector: words below the first option position and words without a dash stay
    // as they are, every other word becomes the full name of the one option it abbreviates.
    // 0, or 1 after the failure has been reported.
    int Pass(Tcl_Interp* interp, int argc, Script::Handle* const* argv, int firstOption);
    // After Pass failed: sets the error code of its failure for the command `word` of
    // `interfaceName`, and gives 1.
    int SetPassFailureCode(Tcl_Interp* interp, const char* interfaceName, const char* word) const;
    Script::Handle* const* Vector() const { return m_slots; }

private:
    static constexpr int kInlineWords = 16;

    // The failures of the matching pass; `word` is the option word as typed.
    int NoMatch(Tcl_Interp* interp, const Port_String& typed, const char* word);
    int Ambiguous(Tcl_Interp* interp, const Port_String& typed, const char* word);
    int MatcherFailure(Tcl_Interp* interp, const Port_String& typed);
    Script::Handle* MakeWord(const Port_String& name);

    // What a failed Pass refused: the reason of an OPTION code (null when the matcher failed) and
    // the option word as typed. Set by the failure paths alone and read only after one of them, so
    // that a call that succeeds does not pay for them.
    const char* m_refusal;
    const char* m_refused;

    CommonI::RefCountPtr<ICmdArgMatcher> m_matcher;
    CommonI::RefCountPtr<IOptionNameList> m_matches;
    CommonI::RefCountPtr<IOptionNameList> m_valid;

    Script::Handle* m_inlineSlots[kInlineWords];
    std::vector<Script::Handle*> m_heapSlots;
    Script::Handle** m_slots = m_inlineSlots;
    std::optional<OptionWord> m_inlineWords[kInlineWords];
    int m_wordsMade = 0;
    std::vector<std::unique_ptr<OptionWord>> m_heapWords;
};

// Requests the component libraries that matched and switch methods use (the matcher and the
// property component); true when both are there. Matched methods ask on every call; the package
// entry asks once, for the switch methods, which never ask.
bool RequestComponentLibraries();

// The position of the first word that, without its leading dash, is exactly a declared name; argc
// when there is none.
int PositionalScan(int argc, Script::Handle* const* words, const Option* options, size_t count);
// The index of the declared option named `name`, or -1.
int FindOption(const char* name, const Option* options, size_t count);

// The text of a word, never null.
inline const char* WordText(Script::Handle* handle) {
    const char* text = handle->GetString();
    return text != nullptr ? text : "";
}

// The option failures of the command `command` of `interfaceName`: the text, and the error code that
// names the command and the option.
int ReportDefaultFailure(Tcl_Interp* interp, const char* name, const char* typeWord, const char* interfaceName,
                         const char* command);
int ReportExpectsValue(Tcl_Interp* interp, const char* name, const char* typeWord, const char* interfaceName,
                       const char* command);
int ReportNotASwitch(Tcl_Interp* interp, const char* word, CitI::IInterface* object, const char* signature,
                     const char* interfaceName, const char* command);
int ReportUnrecognized(Tcl_Interp* interp, const char* name, CitI::IInterface* object, const char* signature,
                       const char* interfaceName, const char* command);

}  // namespace TcltaskI
