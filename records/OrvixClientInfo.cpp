#include "OrvixClientInfo.h"

#include "AssignText.h"

OrvixClientInfo::OrvixClientInfo() = default;
OrvixClientInfo::~OrvixClientInfo() = default;

const wchar_t* OrvixClientInfo::GetClientName()
{
    return m_clientName.c_str();
}

void OrvixClientInfo::SetClientName(const wchar_t* name)
{
    AssignText(m_clientName, name);
}

const wchar_t* OrvixClientInfo::GetUserNameW()
{
    return m_userName.c_str();
}

void OrvixClientInfo::SetUserName(const wchar_t* name)
{
    AssignText(m_userName, name);
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
    return m_providerPluginPath.c_str();
}

void OrvixClientInfo::SetProviderPluginPath(const wchar_t* path)
{
    AssignText(m_providerPluginPath, path);
}

const wchar_t* OrvixClientInfo::GetConfigFilePath()
{
    return m_configFilePath.c_str();
}

void OrvixClientInfo::SetConfigFilePath(const wchar_t* path)
{
    AssignText(m_configFilePath, path);
}

IOrvixClientAccess* OrvixClientInfo::GetIOrvixClientAccess()
{
    return m_clientAccess;
}

void OrvixClientInfo::SetIOrvixClientAccess(IOrvixClientAccess* access)
{
    m_clientAccess = access;
}
