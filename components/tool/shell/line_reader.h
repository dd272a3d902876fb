// The terminal side of the interactive prompt: line editing and history by libedit, the history
// kept in a file from one run to the next, and Tab completion.
//
// libedit's own interface (histedit.h) rather than its readline emulation: the emulation's
// rl_line_buffer is left pointing at freed memory once a line outgrows its first buffer, and it rings
// the bell on every completion that succeeds.
#pragma once

#include <histedit.h>
#include <tcl.h>

#include <memory>
#include <optional>
#include <string>

#include "shell/completion.h"

namespace kelmarsh {

class LineReader {
public:
    // `historyFile` empty: history for this run only. A read ends as interrupted once
    // `interruptFd` is readable (-1: never).
    LineReader(Tcl_Interp* interp, std::string historyFile, int interruptFd);
    ~LineReader();
    LineReader(const LineReader&) = delete;
    LineReader& operator=(const LineReader&) = delete;

    // One line typed after `prompt`, without its newline; nothing at the end of the input or when
    // the read was interrupted. `pending` is what was typed before of the same command, the context
    // of completion.
    std::optional<std::string> Read(const char* prompt, const std::string& pending);

    // A whole command goes into the history once, not again right after itself.
    void Remember(const std::string& command);

private:
    static char* Prompt(EditLine* editor);
    static int GetChar(EditLine* editor, wchar_t* character);
    static unsigned char OnTab(EditLine* editor, int key);
    static void OnExit(ClientData data);
    unsigned char Complete(EditLine* editor);
    void Save();

    Completer m_completer;
    std::string m_historyFile;
    std::string m_prompt;
    std::string m_pending;
    int m_interruptFd;
    // The editor refers to the history: it goes first.
    std::unique_ptr<History, decltype(&history_end)> m_history;
    std::unique_ptr<EditLine, decltype(&el_end)> m_editor;
    bool m_saved = false;
};

}  // namespace kelmarsh
