#pragma once

#include <span>
#include <stdexcept>
#include <string>

class ValidationSubject;

/// Ends the check of a rule that the library breaks. The text says how.
class RuleBroken : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// Ends the check of a rule that cannot be checked. The text says why.
class RuleSkipped : public std::runtime_error
{
public:
    using std::runtime_error::runtime_error;
};

/// Throws `RuleBroken` with this text unless the condition holds.
inline void Require(bool condition, const std::string& broken)
{
    if (!condition)
    {
        throw RuleBroken(broken);
    }
}

/// One rule of the contract that `orvix validate` checks. docs/validate.md describes them.
struct ValidationRule
{
    // The kinds of libraries that a rule is for, as bits.
    static constexpr unsigned int Plugin = 0x1;
    static constexpr unsigned int MSSCCI = 0x2;

    const char* name;
    const char* requirement;
    unsigned int kinds;
    bool showsDialogs; ///< its operations may show windows: checked only when the user asks for it

    /// Runs in a process of its own. Returns when the library keeps the rule; throws `RuleBroken` or `RuleSkipped`.
    void (*check)(ValidationSubject& subject);

    /// Every rule, in the order in which they are checked.
    static std::span<const ValidationRule> All();

    /// The rule of this name for a kind; null when there is none.
    static const ValidationRule* Find(const std::string& name, unsigned int kind);
};
