#include "shell/interrupt.h"

#include <fcntl.h>
#include <unistd.h>

#include <cerrno>
#include <system_error>

namespace kelmarsh {

namespace {

// The handler's only state: where to write, and whether Ctrl-C came. One watcher exists at a time.
volatile sig_atomic_t g_signalFd = -1;
volatile sig_atomic_t g_promptFd = -1;
volatile sig_atomic_t g_interrupted = 0;

// A pipe whose ends never block: the handler must not wait on a full one, and the prompt drains
// its own without waiting.
bool MakePipe(int (&ends)[2]) {
    if (pipe(ends) != 0) return false;
    for (int fd : ends) {
        fcntl(fd, F_SETFL, fcntl(fd, F_GETFL) | O_NONBLOCK);
        fcntl(fd, F_SETFD, FD_CLOEXEC);
    }
    return true;
}

void WriteByte(int fd) {
    if (fd < 0) return;
    const char byte = 'i';
    [[maybe_unused]] const ssize_t written = write(fd, &byte, 1);
}

}  // namespace

InterruptWatcher::InterruptWatcher(Tcl_Interp* interp) : m_interp(interp) {
    if (!MakePipe(m_pipe)) {
        m_stopped = true;  // without a pipe Ctrl-C keeps its default effect
        return;
    }
    if (!MakePipe(m_prompt)) {
        close(m_pipe[0]);
        close(m_pipe[1]);
        m_stopped = true;
        return;
    }
    // The thread waits on its pipe.
    fcntl(m_pipe[0], F_SETFL, fcntl(m_pipe[0], F_GETFL) & ~O_NONBLOCK);
    try {
        m_thread = std::thread(&InterruptWatcher::Watch, this);
    } catch (const std::system_error&) {
        for (int fd : {m_pipe[0], m_pipe[1], m_prompt[0], m_prompt[1]}) close(fd);
        m_prompt[0] = -1;
        m_stopped = true;
        return;
    }
    g_signalFd = m_pipe[1];
    g_promptFd = m_prompt[1];

    // No SA_RESTART: a call of the running command that waits returns, and the cancel is seen.
    struct sigaction action {};
    action.sa_handler = &InterruptWatcher::OnSignal;
    sigemptyset(&action.sa_mask);
    sigaction(SIGINT, &action, &m_previous);
    // `exit` in a command ends the process from inside Tcl: the thread is stopped on that way too.
    Tcl_CreateExitHandler(&InterruptWatcher::OnExit, this);
}

InterruptWatcher::~InterruptWatcher() {
    Tcl_DeleteExitHandler(&InterruptWatcher::OnExit, this);
    Stop();
}

void InterruptWatcher::OnExit(ClientData data) { static_cast<InterruptWatcher*>(data)->Stop(); }

void InterruptWatcher::Stop() {
    if (m_stopped) return;
    m_stopped = true;
    sigaction(SIGINT, &m_previous, nullptr);
    g_signalFd = -1;
    g_promptFd = -1;
    close(m_pipe[1]);  // the thread reads the end of the pipe and returns
    m_thread.join();
    close(m_pipe[0]);
    close(m_prompt[1]);
    close(m_prompt[0]);
    m_prompt[0] = -1;
}

void InterruptWatcher::OnSignal(int) {
    const int saved = errno;
    g_interrupted = 1;
    WriteByte(g_signalFd);
    WriteByte(g_promptFd);
    errno = saved;
}

void InterruptWatcher::Watch() {
    for (;;) {
        char byte;
        const ssize_t got = read(m_pipe[0], &byte, 1);
        if (got == 0) return;
        if (got < 0) {
            if (errno == EINTR) continue;
            return;
        }
        if (m_running.load()) {
            m_cancelled.store(true);
            Tcl_CancelEval(m_interp, nullptr, nullptr, TCL_CANCEL_UNWIND);
        }
    }
}

void InterruptWatcher::BeginCommand() {
    m_cancelled.store(false);
    g_interrupted = 0;
    m_running.store(true);
}

bool InterruptWatcher::EndCommand() {
    m_running.store(false);
    g_interrupted = 0;
    return m_cancelled.exchange(false);
}

bool InterruptWatcher::TakeInterrupt() {
    char bytes[64];
    while (m_prompt[0] >= 0 && read(m_prompt[0], bytes, sizeof bytes) > 0) {
    }
    const bool interrupted = g_interrupted != 0;
    g_interrupted = 0;
    return interrupted;
}

}  // namespace kelmarsh
