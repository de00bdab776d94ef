#include "ValidationLibrary.h"

#include "Text.h"

#include <array>

namespace
{
std::string SystemText(DWORD error)
{
    std::array<wchar_t, 512> text{};
    FormatMessageW(FORMAT_MESSAGE_FROM_SYSTEM | FORMAT_MESSAGE_IGNORE_INSERTS | FORMAT_MESSAGE_MAX_WIDTH_MASK, nullptr,
                   error, 0, text.data(), static_cast<DWORD>(text.size()), nullptr);
    return "error " + std::to_string(error) + ", " + Utf8(text.data());
}
} // namespace

ValidationLibrary::ValidationLibrary(ValidationSubject& subject) : m_subject(subject)
{
    subject.Call("loading", [this] { m_module = LoadLibraryIsolated(m_subject.Library().c_str(), ManifestContext()); });
    if (!m_module)
    {
        throw RuleSkipped("it does not load: " + SystemText(GetLastError()));
    }
}

ValidationLibrary::~ValidationLibrary()
{
    m_subject.Tell(ValidationSubject::Step, "unloading");
}
