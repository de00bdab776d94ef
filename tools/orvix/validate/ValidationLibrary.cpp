#include "ValidationLibrary.h"

#include "ActivationContext.h"
#include "LibraryModule.h"
#include "Text.h"

ValidationLibrary::ValidationLibrary(ValidationSubject& subject) : m_subject(subject)
{
    subject.Call("loading", [this] {
        m_module = LoadLibraryIsolated(m_subject.Library().c_str(), MakeManifestContext(LibraryModule()));
    });
    if (!m_module)
    {
        throw RuleSkipped("it does not load: " + Utf8(SystemMessage(GetLastError(), m_subject.Library())));
    }
}

ValidationLibrary::~ValidationLibrary()
{
    ParentLink::Send(ParentLink::Step, "unloading");
}
