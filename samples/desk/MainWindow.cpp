#include "MainWindow.h"

#include "Failure.h"
#include "FileCommand.h"
#include "OrvixFileFlags.h"
#include "OrvixPrompt.h"
#include "Progress.h"
#include "ProviderPage.h"
#include "Settings.h"
#include "resource.h"

#include <objbase.h>
#include <shobjidl.h>
#include <windowsx.h>

#include <algorithm>
#include <bit>
#include <exception>
#include <filesystem>
#include <utility>

namespace
{

constexpr const wchar_t* ClassName = L"OrvixDesk";
constexpr const wchar_t* Title = L"Desk";
constexpr UINT OpenFirst = WM_APP + 2; // opens the project of the command line; the window is shown before
static_assert(OpenFirst != OutputPane::Arrived);

HWND MakeWindow(void* self, WNDPROC procedure)
{
    WNDCLASSEXW windowClass{};
    windowClass.cbSize = sizeof windowClass;
    windowClass.lpfnWndProc = procedure;
    windowClass.hInstance = GetModuleHandleW(nullptr);
    windowClass.hCursor = LoadCursorW(nullptr, IDC_ARROW);
    windowClass.hIcon = LoadIconW(nullptr, IDI_APPLICATION);
    windowClass.lpszMenuName = MAKEINTRESOURCEW(IDR_DESK);
    windowClass.lpszClassName = ClassName;
    RegisterClassExW(&windowClass); // fails for the second window of a process, which uses the same class
    const int dpi = static_cast<int>(GetDpiForSystem());
    return CreateWindowExW(WS_EX_CONTROLPARENT, ClassName, Title, WS_OVERLAPPEDWINDOW | WS_CLIPCHILDREN, CW_USEDEFAULT,
                           CW_USEDEFAULT, MulDiv(920, dpi, 96), MulDiv(600, dpi, 96), nullptr, nullptr,
                           windowClass.hInstance, self);
}

/// Releases a COM object.
struct ComRelease
{
    void operator()(IUnknown* object) const { object->Release(); }
};

/// The folder that the user chooses; empty when the user cancels.
std::wstring AskForFolder(HWND owner)
{
    void* object = nullptr;
    if (FAILED(CoCreateInstance(CLSID_FileOpenDialog, nullptr, CLSCTX_INPROC_SERVER, IID_IFileOpenDialog, &object)))
    {
        return {};
    }
    const std::unique_ptr<IFileOpenDialog, ComRelease> dialog(static_cast<IFileOpenDialog*>(object));
    dialog->SetOptions(FOS_PICKFOLDERS | FOS_FORCEFILESYSTEM);
    IShellItem* chosen = nullptr;
    if (dialog->Show(owner) != S_OK || FAILED(dialog->GetResult(&chosen)))
    {
        return {};
    }
    const std::unique_ptr<IShellItem, ComRelease> item(chosen);
    wchar_t* path = nullptr;
    if (FAILED(item->GetDisplayName(SIGDN_FILESYSPATH, &path)))
    {
        return {};
    }
    std::wstring folder = path;
    CoTaskMemFree(path);
    return folder;
}

} // namespace

/// A command at work. A provider or a dialog may handle messages meanwhile. Then no other command may begin, and the
/// library must not be shut down: a window that is to close closes afterwards.
class MainWindow::Work
{
public:
    explicit Work(MainWindow& window) : m_window(window), m_wasBusy(std::exchange(window.m_busy, true)) {}
    Work(const Work&) = delete;
    Work& operator=(const Work&) = delete;
    ~Work()
    {
        m_window.m_busy = m_wasBusy;
        if (!m_wasBusy && std::exchange(m_window.m_closeAsked, false))
        {
            PostMessageW(m_window.m_window, WM_CLOSE, 0, 0);
        }
    }

private:
    MainWindow& m_window;
    bool m_wasBusy;
};

MainWindow::MainWindow(const Arguments& arguments)
    : m_arguments(arguments), m_access(m_output, m_theme, arguments.unattended), m_listener(m_output)
{
    const INITCOMMONCONTROLSEX classes{sizeof classes, ICC_WIN95_CLASSES};
    InitCommonControlsEx(&classes);
    m_ownedWindow.reset(MakeWindow(this, &Procedure));
    if (!m_ownedWindow)
    {
        throw Failure{L"The window cannot be made."};
    }
    m_library = std::make_unique<Library>(arguments, m_access, m_window);
    SetDark(Settings::IsDark());
    m_frame.SetStatus(L"Project, Open opens the folder of a project.");
    EnableCommands();
    ShowWindow(m_window, SW_SHOWDEFAULT);
    if (!arguments.project.empty())
    {
        PostMessageW(m_window, OpenFirst, 0, 0);
    }
}

int MainWindow::Run()
{
    // The system frees an accelerator table of the resources.
    const HACCEL accelerators = LoadAcceleratorsW(GetModuleHandleW(nullptr), MAKEINTRESOURCEW(IDR_DESK));
    MSG message{};
    while (GetMessageW(&message, nullptr, 0, 0) > 0)
    {
        if (TranslateAcceleratorW(m_window, accelerators, &message) == 0 &&
            IsDialogMessageW(m_window, &message) == FALSE)
        {
            TranslateMessage(&message);
            DispatchMessageW(&message);
        }
    }
    return static_cast<int>(message.wParam);
}

LRESULT CALLBACK MainWindow::Procedure(HWND window, UINT message, WPARAM wParam, LPARAM lParam) noexcept
{
    if (message == WM_NCCREATE)
    {
        auto* created = static_cast<MainWindow*>(std::bit_cast<const CREATESTRUCTW*>(lParam)->lpCreateParams);
        SetWindowLongPtrW(window, GWLP_USERDATA, reinterpret_cast<LONG_PTR>(created));
        created->m_window = window;
    }
    auto* self = std::bit_cast<MainWindow*>(GetWindowLongPtrW(window, GWLP_USERDATA));
    if (self == nullptr)
    {
        return DefWindowProcW(window, message, wParam, lParam);
    }
    try
    {
        return self->Handle(message, wParam, lParam);
    }
    catch (const Failure& failure)
    {
        self->Report(failure.text);
    }
    catch (const std::exception& failure)
    {
        self->Report(std::filesystem::path(failure.what()).wstring());
    }
    return 0;
}

LRESULT MainWindow::Handle(UINT message, WPARAM wParam, LPARAM lParam)
{
    switch (message)
    {
    case WM_CREATE:
        m_frame.Create(m_window, m_output);
        return 0;
    case OpenFirst:
        Open(m_arguments.project, m_library->ChooseProvider(m_arguments.provider));
        return 0;
    case OutputPane::Arrived:
        m_output.ShowArrived();
        return 0;
    case WM_COMMAND:
        OnCommand(LOWORD(wParam));
        return 0;
    case WM_NOTIFY:
        return OnNotify(*std::bit_cast<NMHDR*>(lParam));
    case WM_CONTEXTMENU:
        if (std::bit_cast<HWND>(wParam) == m_frame.Files().Window())
        {
            OnContextMenu({GET_X_LPARAM(lParam), GET_Y_LPARAM(lParam)});
            return 0;
        }
        break;
    case WM_SIZE:
        m_frame.Layout();
        return 0;
    case WM_DPICHANGED:
        OnResolution(*std::bit_cast<const RECT*>(lParam));
        return 0;
    case WM_ERASEBKGND:
        m_frame.Erase(std::bit_cast<HDC>(wParam));
        return 1;
    case WM_CTLCOLORSTATIC:
        return reinterpret_cast<LRESULT>(m_frame.Paint(std::bit_cast<HDC>(wParam), std::bit_cast<HWND>(lParam)));
    case WM_SYSCOLORCHANGE:
        m_frame.UseTheme(m_theme);
        return 0;
    case WM_ACTIVATE:
        m_focus = LOWORD(wParam) == WA_INACTIVE ? GetFocus() : m_focus;
        break;
    case WM_SETFOCUS:
        SetFocus(IsChild(m_window, m_focus) != FALSE ? m_focus : m_frame.Files().Window());
        return 0;
    case WM_NEXTDLGCTL: // a control asks for the focus to move, as in a dialog
        SetFocus(LOWORD(lParam) != 0 ? std::bit_cast<HWND>(wParam)
                                     : GetNextDlgTabItem(m_window, GetFocus(), wParam != 0 ? TRUE : FALSE));
        return 0;
    case WM_CLOSE:
        OnClose();
        return 0;
    case WM_DESTROY:
        OnDestroy();
        return 0;
    default:
        break;
    }
    return DefWindowProcW(m_window, message, wParam, lParam);
}

void MainWindow::OnCommand(int command)
{
    const UINT state = GetMenuState(GetMenu(m_window), static_cast<UINT>(command), MF_BYCOMMAND);
    const bool isInMenu = state != static_cast<UINT>(-1);
    if (m_busy || (isInMenu && (state & MF_GRAYED) != 0))
    {
        return;
    }
    const Work work(*this);
    if (const FileCommand* fileCommand = FindFileCommand(command))
    {
        RunFileCommand(*fileCommand);
    }
    else
    {
        RunCommand(command);
    }
    EnableCommands();
}

void MainWindow::RunCommand(int command)
{
    switch (command)
    {
    case ID_OPEN:
        ChooseFolder();
        break;
    case ID_NEW_WINDOW:
        OpenNewWindow();
        break;
    case ID_EXIT:
        PostMessageW(m_window, WM_CLOSE, 0, 0);
        break;
    case ID_HISTORY:
        ShowHistory();
        break;
    case ID_PROPERTIES:
        m_project->ShowProperties(FilesThatAllow(OrvixFileState::Controlled));
        break;
    case ID_REFRESH:
        Refresh();
        break;
    case ID_SUBFOLDERS:
        m_deep = !m_deep;
        Refresh();
        break;
    case ID_DARK:
        SetDark(!m_theme.IsDark());
        Settings::StoreDark(m_theme.IsDark());
        break;
    case ID_ANSWERS:
        m_library->Services().EditPrompts(m_window, nullptr);
        break;
    case ID_PROVIDERS:
        ShowOptions();
        break;
    case ID_FREEZE:
        m_listener.SetFrozen(!m_listener.IsFrozen());
        break;
    case IDOK:
        OnEnterKey();
        break;
    default:
        break;
    }
}

LRESULT MainWindow::OnNotify(NMHDR& notification)
{
    switch (notification.code)
    {
    case TVN_ITEMEXPANDINGW:
        m_frame.Folders().OnExpanding(*reinterpret_cast<NMTREEVIEWW*>(&notification));
        break;
    case TVN_SELCHANGEDW:
        if (!m_busy)
        {
            const Work work(*this);
            Refresh();
        }
        break;
    case LVN_GETDISPINFOW:
        m_frame.Files().FillItem(reinterpret_cast<NMLVDISPINFOW*>(&notification)->item);
        break;
    case LVN_ITEMCHANGED:
    case LVN_ODSTATECHANGED:
        EnableCommands();
        break;
    case NM_DBLCLK:
        if (notification.hwndFrom == m_frame.Files().Window())
        {
            OnCommand(ID_PROPERTIES);
        }
        break;
    case NM_CUSTOMDRAW:
        return m_frame.PaintToolbar(notification);
    default:
        break;
    }
    return 0;
}

void MainWindow::OnContextMenu(POINT point) const
{
    if (point.x == -1 && point.y == -1)
    {
        point = m_frame.Files().FocusedPoint(); // asked for by keyboard
    }
    TrackPopupMenu(GetSubMenu(GetMenu(m_window), 1), TPM_RIGHTBUTTON, point.x, point.y, 0, m_window, nullptr);
}

void MainWindow::OnResolution(const RECT& place)
{
    m_frame.UseResolution();
    SetWindowPos(m_window, nullptr, place.left, place.top, place.right - place.left, place.bottom - place.top,
                 SWP_NOZORDER | SWP_NOACTIVATE);
}

void MainWindow::OnClose()
{
    if (m_busy)
    {
        m_closeAsked = true;
        return;
    }
    bool close = false;
    {
        const Work work(*this);
        close = MayClose();
        m_closeAsked = false;
    }
    if (close)
    {
        DestroyWindow(m_window);
    }
}

void MainWindow::OnDestroy()
{
    m_project.reset();
    m_library.reset();
    SetWindowLongPtrW(m_window, GWLP_USERDATA, 0); // the last messages do without this object
    m_ownedWindow.release();                       // being destroyed
    m_window = nullptr;
    PostQuitMessage(0);
}

/// Enter does with the control that has the focus what a double click does.
void MainWindow::OnEnterKey()
{
    if (GetFocus() == m_frame.Files().Window())
    {
        PostMessageW(m_window, WM_COMMAND, ID_PROPERTIES, 0);
    }
    else if (GetFocus() == m_frame.Folders().Window())
    {
        m_frame.Folders().Toggle();
    }
}

void MainWindow::Open(const std::wstring& folder, std::uint32_t provider)
{
    const Work work(*this);
    m_project.reset();
    m_frame.Folders().ShowProject(L"");
    m_frame.Files().Show({});
    EnableCommands();
    m_frame.SetProvider(L"");
    SetWindowTextW(m_window, Title);

    m_project = std::make_unique<Project>(*m_library, provider, folder);
    m_frame.Folders().ShowProject(m_project->Folder());
    m_frame.SetProvider(m_project->ProviderName() + (m_arguments.unattended ? L", unattended" : L""));
    Refresh();
    SetWindowTextW(m_window, (m_project->Folder() + L" - " + Title).c_str());
}

void MainWindow::ChooseFolder()
{
    const std::wstring folder = AskForFolder(m_window);
    if (!folder.empty())
    {
        Open(folder, m_library->ChooseProvider(m_arguments.provider));
    }
}

/// Starts the program again, with the same settings and no project.
void MainWindow::OpenNewWindow() const
{
    wchar_t program[MAX_PATH] = {};
    GetModuleFileNameW(nullptr, program, MAX_PATH);
    // The dots keep a separator at the end from escaping the quote.
    std::wstring commandLine = L'"' + std::wstring(program) + L"\" --plugins \"" + m_arguments.plugins +
                               L".\" --config \"" + m_arguments.config + L"\\.\"" +
                               (m_arguments.unattended ? L" --unattended" : L"");
    if (!m_arguments.provider.empty())
    {
        commandLine += L" --provider \"" + m_arguments.provider + L'"';
    }
    STARTUPINFOW start{};
    start.cb = sizeof start;
    PROCESS_INFORMATION process{};
    if (CreateProcessW(program, commandLine.data(), nullptr, nullptr, FALSE, 0, nullptr, nullptr, &start, &process) ==
        FALSE)
    {
        throw Failure{L"The program cannot be started again."};
    }
    const UniqueSystemHandle handle(process.hProcess);
    const UniqueSystemHandle thread(process.hThread);
}

void MainWindow::Refresh()
{
    const std::wstring folder = m_frame.Folders().Selected();
    if (!m_project || folder.empty())
    {
        return;
    }
    m_frame.SetStatus(L"Looking at the files; Esc stops");
    std::vector<FileRow> rows;
    {
        Progress progress(m_frame.ProgressBar());
        rows = m_project->Files(folder, m_deep, progress);
    }
    m_frame.SetStatus(std::to_wstring(rows.size()) + (rows.size() == 1 ? L" file in " : L" files in ") + folder);
    m_frame.Files().Show(std::move(rows));
    EnableCommands();
}

void MainWindow::RunFileCommand(const FileCommand& command)
{
    const std::wstring name = command.name;
    m_frame.SetStatus(name + L"...");
    const bool done = m_project->Run(command, FilesThatAllow(command.permission), m_window);
    Refresh();
    m_frame.SetStatus(name + (done ? L": done" : L": cancelled"));
}

void MainWindow::ShowHistory()
{
    if (m_project->ShowHistory(FilesThatAllow(OrvixFilePermission::ShowHistory)))
    {
        Refresh();
    }
}

void MainWindow::ShowOptions()
{
    const auto current = m_project ? std::optional(m_project->ProviderIndex()) : std::nullopt;
    const auto chosen = ProviderPage(*m_library, m_output, current).Show(m_window);
    if (chosen && m_project)
    {
        Open(m_project->Folder(), *chosen);
    }
}

/// Asks before files stay checked out, unless the user has answered that for good.
bool MainWindow::MayClose()
{
    const auto& rows = m_frame.Files().Rows();
    const auto count = std::count_if(rows.begin(), rows.end(),
                                     [](const FileRow& row) { return (row.flags & OrvixFileState::CheckedOut) != 0; });
    if (count == 0)
    {
        return true;
    }
    std::wstring title = Title;
    std::wstring message =
        std::to_wstring(count) + (count == 1 ? L" file is" : L" files are") + L" checked out here. End the program?";
    return m_library->Services().ShowPrompt(m_window, title.data(), message.data(), OrvixPromptOption::OfferStopAsking,
                                            ExitPrompt, nullptr) == OrvixPromptAnswer::Yes;
}

void MainWindow::SetDark(bool dark)
{
    m_theme.SetDark(dark);
    m_frame.UseTheme(m_theme);
}

void MainWindow::EnableCommands()
{
    const HMENU menu = GetMenu(m_window);
    const auto enable = [&](int command, bool enabled) {
        EnableMenuItem(menu, static_cast<UINT>(command), enabled ? MF_ENABLED : MF_GRAYED);
        m_frame.EnableButton(command, enabled);
    };
    const auto check = [menu](int command, bool checked) {
        CheckMenuItem(menu, static_cast<UINT>(command), checked ? MF_CHECKED : MF_UNCHECKED);
    };
    for (const FileCommand& command : FileCommands())
    {
        enable(command.id, !FilesThatAllow(command.permission).empty());
    }
    enable(ID_HISTORY, !FilesThatAllow(OrvixFilePermission::ShowHistory).empty());
    enable(ID_PROPERTIES, !FilesThatAllow(OrvixFileState::Controlled).empty());
    enable(ID_REFRESH, m_project != nullptr);
    check(ID_SUBFOLDERS, m_deep);
    check(ID_DARK, m_theme.IsDark());
    check(ID_FREEZE, m_listener.IsFrozen());
}

/// The files for a command: of the selected ones, or of all when none is selected, those with a bit in their flags.
/// The latest version would replace the changes of files that are checked out or modified: they are left out.
std::vector<const FileRow*> MainWindow::FilesThatAllow(unsigned long permission) const
{
    std::vector<const FileRow*> files = m_frame.Files().Chosen();
    const unsigned long changed =
        permission == OrvixFilePermission::GetLatest ? OrvixFileState::CheckedOut | OrvixFileState::Modified : 0;
    std::erase_if(files, [permission, changed](const FileRow* row) {
        return (row->flags & permission) == 0 || (row->flags & changed) != 0;
    });
    return files;
}

void MainWindow::Report(const std::wstring& text)
{
    m_output.Add(text);
    if (!m_arguments.unattended)
    {
        const Work work(*this);
        MessageBoxW(m_window, text.c_str(), L"Desk cannot do this", MB_ICONERROR);
    }
}
