#include "OrvixClientInfo.h"

#include "RecordState.h"

struct OrvixClientInfo::State
{
    std::wstring clientName;
    std::wstring userName;
    std::wstring providerPluginPath;
    std::wstring configFilePath;
};

OrvixClientInfo::OrvixClientInfo() = default;

OrvixClientInfo::~OrvixClientInfo()
{
    delete m_state;
}

const wchar_t* OrvixClientInfo::GetClientName()
{
    return TextOf(m_state, &State::clientName);
}

void OrvixClientInfo::SetClientName(const wchar_t* name)
{
    SetText(m_state, &State::clientName, name);
}

const wchar_t* OrvixClientInfo::GetUserNameW()
{
    return TextOf(m_state, &State::userName);
}

void OrvixClientInfo::SetUserName(const wchar_t* name)
{
    SetText(m_state, &State::userName, name);
}

HWND__* OrvixClientInfo::GetParentWindow()
{
    return m_parentWindow;
}

void OrvixClientInfo::SetParentWindow(HWND__* window)
{
    m_parentWindow = window;
}

const wchar_t* OrvixClientInfo::GetProviderPluginPath()
{
    return TextOf(m_state, &State::providerPluginPath);
}

void OrvixClientInfo::SetProviderPluginPath(const wchar_t* path)
{
    SetText(m_state, &State::providerPluginPath, path);
}

const wchar_t* OrvixClientInfo::GetConfigFilePath()
{
    return TextOf(m_state, &State::configFilePath);
}

void OrvixClientInfo::SetConfigFilePath(const wchar_t* path)
{
    SetText(m_state, &State::configFilePath, path);
}

IOrvixClientAccess* OrvixClientInfo::GetIOrvixClientAccess()
{
    return m_clientAccess;
}

void OrvixClientInfo::SetIOrvixClientAccess(IOrvixClientAccess* access)
{
    m_clientAccess = access;
}
