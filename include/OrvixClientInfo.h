#pragma once

#include "BraeHeapOperators.h"
#include "OrvixExport.h"

class IOrvixClientAccess;
struct HWND__;

/// Who the client is and where its files are; the argument of `IOrvixServices::Initialize`.
///
/// Created and owned by the host; the library does not keep it. Texts are copied in: a setter given null
/// (and any setter when memory runs out) leaves the old text. A getter's text is never null and is valid until the
/// field is set again or the record is destroyed. Nothing is checked. All operations: [library, main-thread].
class ORVIX_API OrvixClientInfo : public BraeHeapOperators
{
public:
    /// Makes a record without texts, window and client access; allocates nothing.
    OrvixClientInfo();
    OrvixClientInfo(const OrvixClientInfo&) = delete;
    OrvixClientInfo& operator=(const OrvixClientInfo&) = delete;
    /// Frees the copies of the texts; the client access and the window stay with their owner.
    virtual ~OrvixClientInfo();

    /// Name of the client program, as providers show it; empty by default.
    virtual const wchar_t* GetClientName();
    /// Sets the name of the client program; a copy is kept.
    virtual void SetClientName(const wchar_t* name);

    /// Login name of the user; empty by default. The name ends in W so that no header's macro changes it.
    virtual const wchar_t* GetUserNameW();
    /// Sets the login name; a copy is kept.
    virtual void SetUserName(const wchar_t* name);

    /// Window that providers' dialogs belong to; null by default. Not owned.
    virtual HWND__* GetParentWindow();
    /// Sets the parent window; null for none.
    virtual void SetParentWindow(HWND__* window);

    /// Folder that is searched for provider plug-ins. "*.dll" is appended to it directly, so it ends in a
    /// backslash; the whole path of a plug-in must fit 260 characters, terminator included. Null or empty (the
    /// default) means that there are no plug-ins: the current folder is never searched.
    virtual const wchar_t* GetProviderPluginPath();
    /// Sets the plug-in folder; a copy is kept as it is, with no backslash added.
    virtual void SetProviderPluginPath(const wchar_t* path);

    /// Folder of "OrvixProviders.xml" and "OrvixPrompts.xml", without a backslash at its end: one is always
    /// added.
    virtual const wchar_t* GetConfigFilePath();
    /// Sets the configuration folder; a copy is kept as it is.
    virtual void SetConfigFilePath(const wchar_t* path);

    /// The host's call-back interface; null by default. Not owned; it must outlive the services object.
    virtual IOrvixClientAccess* GetIOrvixClientAccess();
    /// Sets the call-back interface; null for none.
    virtual void SetIOrvixClientAccess(IOrvixClientAccess* access);

private:
    // The texts; null until one is stored. Numbers and pointers are members, so that setting them cannot fail.
    struct State;
    State* m_state = nullptr;
    HWND__* m_parentWindow = nullptr;
    IOrvixClientAccess* m_clientAccess = nullptr;
};

static_assert(sizeof(OrvixClientInfo) == 32, "host and library must agree about the size of a record");
