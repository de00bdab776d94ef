#include "OrvixUserEntry.h"

#include "RecordState.h"

struct OrvixUserEntry::State
{
    std::wstring userName;
    std::wstring firstName;
    std::wstring lastName;
    std::wstring email;
};

OrvixUserEntry::OrvixUserEntry() = default;

OrvixUserEntry::~OrvixUserEntry()
{
    delete m_state;
}

const wchar_t* OrvixUserEntry::GetUserNameW()
{
    return TextOf(m_state, &State::userName);
}

void OrvixUserEntry::SetUserName(const wchar_t* name)
{
    SetText(m_state, &State::userName, name);
}

const wchar_t* OrvixUserEntry::GetFirstName()
{
    return TextOf(m_state, &State::firstName);
}

void OrvixUserEntry::SetFirstName(const wchar_t* name)
{
    SetText(m_state, &State::firstName, name);
}

const wchar_t* OrvixUserEntry::GetLastName()
{
    return TextOf(m_state, &State::lastName);
}

void OrvixUserEntry::SetLastName(const wchar_t* name)
{
    SetText(m_state, &State::lastName, name);
}

const wchar_t* OrvixUserEntry::GetEmail()
{
    return TextOf(m_state, &State::email);
}

void OrvixUserEntry::SetEmail(const wchar_t* email)
{
    SetText(m_state, &State::email, email);
}
