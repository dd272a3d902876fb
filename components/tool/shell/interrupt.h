// Ctrl-C at the interactive prompt: it interrupts the running command, never the shell.
//
// The signal handler only sets a flag and writes a byte into a pipe, which is all a handler may
// safely do. A thread of the watcher reads the pipe and, while a command runs, asks Tcl to unwind
// it with Tcl_CancelEval, which Tcl allows from any thread and which no `catch` in the script can
// stop. The handler writes into a second pipe that the prompt's terminal read watches, so that a
// Ctrl-C there ends the read wherever the editor was, and the line is discarded.
#pragma once

#include <tcl.h>

#include <atomic>
#include <csignal>
#include <thread>

namespace kelmarsh {

class InterruptWatcher {
public:
    explicit InterruptWatcher(Tcl_Interp* interp);
    ~InterruptWatcher();
    InterruptWatcher(const InterruptWatcher&) = delete;
    InterruptWatcher& operator=(const InterruptWatcher&) = delete;

    // Around a command: Ctrl-C in between cancels it. EndCommand tells whether it did.
    void BeginCommand();
    bool EndCommand();

    // Whether Ctrl-C came since the last call; forgets it.
    bool TakeInterrupt();

    // Readable once Ctrl-C came, until TakeInterrupt; -1 when there is none.
    int PromptFd() const { return m_prompt[0]; }

private:
    static void OnSignal(int);
    static void OnExit(ClientData data);
    void Watch();
    void Stop();

    Tcl_Interp* m_interp;
    int m_pipe[2] = {-1, -1};    // to the thread
    int m_prompt[2] = {-1, -1};  // to the prompt
    std::thread m_thread;
    struct sigaction m_previous {};
    std::atomic<bool> m_running{false};
    std::atomic<bool> m_cancelled{false};
    bool m_stopped = false;
};

}  // namespace kelmarsh
