#include "OrvixUserEntry.h"

#include "AssignText.h"

OrvixUserEntry::OrvixUserEntry() = default;
OrvixUserEntry::~OrvixUserEntry() = default;

const wchar_t* OrvixUserEntry::GetUserNameW()
{
    return m_userName.c_str();
}

void OrvixUserEntry::SetUserName(const wchar_t* name)
{
    AssignText(m_userName, name);
}

const wchar_t* OrvixUserEntry::GetFirstName()
{
    return m_firstName.c_str();
}

void OrvixUserEntry::SetFirstName(const wchar_t* name)
{
    AssignText(m_firstName, name);
}

const wchar_t* OrvixUserEntry::GetLastName()
{
    return m_lastName.c_str();
}

void OrvixUserEntry::SetLastName(const wchar_t* name)
{
    AssignText(m_lastName, name);
}

const wchar_t* OrvixUserEntry::GetEmail()
{
    return m_email.c_str();
}

void OrvixUserEntry::SetEmail(const wchar_t* email)
{
    AssignText(m_email, email);
}
