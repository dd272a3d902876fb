// The tool state as the floorplan and the timing analysis hold it: weakly, since the interpreter
// owns the state and a script may keep one of these objects beyond the interpreter's end.
#pragma once

#include <memory>

#include "design.h"
#include "property.h"

namespace kelmartool {

class WeakState {
public:
    explicit WeakState(const StatePtr& state) : m_state(state) {}

    // Runs `op` on the tool state while its interpreter lives; the state lives at least as long as
    // the call.
    template <class Op>
    CommonI::RESULT On(Port_String& message, Op op) const {
        const StatePtr state = m_state.lock();
        if (!state) return Fail(message, kStateGone);
        if (!Alive(*state, message)) return 0;
        return op(*state);
    }

private:
    std::weak_ptr<ToolState> m_state;
};

}  // namespace kelmartool
