#pragma once

#include "IOrvixNotifyCallback.h"
#include "OrvixListenerRegistration.h"
#include "OutputPane.h"

/// Listens to the operations of the library. During a code freeze it vetoes every check-in. It says in the output what
/// was vetoed and what was done.
class OperationListener final : public IOrvixNotifyCallback
{
public:
    /// `output` outlives this object.
    explicit OperationListener(OutputPane& output) : m_output(output), m_registration(*this) {}

    void SetFrozen(bool frozen) { m_frozen = frozen; }
    bool IsFrozen() const { return m_frozen; }

    std::uint32_t Notify(OrvixNotifyParams* params, std::int64_t userData) override;

private:
    OutputPane& m_output;
    bool m_frozen = false;
    OrvixListenerRegistration m_registration; // the last member: it ends first
};
