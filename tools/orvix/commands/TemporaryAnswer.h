#pragma once

#include "IOrvixServices.h"

/// Replaces the stored answer of a prompt and restores it at the end, so that an answer of the command line never
/// becomes the user's stored answer. A locked answer stays as it is.
class TemporaryAnswer
{
public:
    /// `action`: bits of `OrvixPromptAction`. `services` must outlive this object.
    TemporaryAnswer(IOrvixServices& services, std::uint32_t prompt, std::uint32_t action)
        : m_services(services), m_prompt(prompt), m_previous(services.GetPromptAction(prompt))
    {
        m_services.SetPromptAction(m_prompt, action);
    }
    TemporaryAnswer(const TemporaryAnswer&) = delete;
    TemporaryAnswer& operator=(const TemporaryAnswer&) = delete;
    ~TemporaryAnswer() { m_services.SetPromptAction(m_prompt, m_previous); }

private:
    IOrvixServices& m_services;
    std::uint32_t m_prompt;
    std::uint32_t m_previous;
};
