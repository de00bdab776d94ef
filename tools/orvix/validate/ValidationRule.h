#pragma once

#include <span>
#include <stdexcept>
#include <string>

class ValidationSubject;

/// Ends the check of a rule that the library does not keep; the text says how.
class RuleBroken : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// Ends the check of a rule that cannot be looked at; the text says why.
class RuleSkipped : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// One demand of the contract that `orvix validate` checks; described in docs/validate.md.
struct ValidationRule
{
    // For what a rule holds, as bits.
    static constexpr unsigned int Plugin = 0x1;
    static constexpr unsigned int MSSCCI = 0x2;

    const char* name;
    const char* demand;
    unsigned int kinds;
    bool showsDialogs; ///< the operations are made for people: checked only when asked for

    /// Runs in a process of its own. Returns when the rule is kept, or throws `RuleBroken` or `RuleSkipped`.
    void (*check)(ValidationSubject& subject);

    /// Every rule, in the order in which they are checked.
    static std::span<const ValidationRule> All();

    /// The rule of this name for a kind; null when there is none.
    static const ValidationRule* Find(const std::string& name, unsigned int kind);
};
