#pragma once

#include "Library.h"
#include "OutputPane.h"

#include <windows.h>

#include <optional>

/// The page for providers in an application's options (a property sheet): which providers the program uses, which one
/// the project has, and the options and the program of each.
class ProviderPage
{
public:
    /// `current` is the provider of the open project, if any. `library` and `output` outlive this object.
    ProviderPage(Library& library, OutputPane& output, std::optional<std::uint32_t> current)
        : m_library(library), m_output(output), m_current(current), m_used(current)
    {
    }

    /// Shows the options with this page. Returns the provider that the user wants to use from now on, nothing when it
    /// does not change. The other choices are stored when the user confirms.
    std::optional<std::uint32_t> Show(HWND owner);

private:
    static INT_PTR CALLBACK Procedure(HWND page, UINT message, WPARAM wParam, LPARAM lParam);
    INT_PTR Handle(UINT message, WPARAM wParam, LPARAM lParam);
    void Fill();
    void ShowStates();
    void Use();
    void Store();
    template <typename Work>
    void WithProvider(const wchar_t* offer, Work work);
    void RunProgram();
    std::optional<std::uint32_t> Selected() const;
    LRESULT OnNotify(const NMHDR& notification);

    Library& m_library;
    OutputPane& m_output;
    std::optional<std::uint32_t> m_current;
    std::optional<std::uint32_t> m_used;
    HWND m_page = nullptr;
    HWND m_list = nullptr;
    bool m_confirmed = false;
};
