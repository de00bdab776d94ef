#include "OrvixFileListDialogParams.h"

#include "RecordState.h"

struct OrvixFileListDialogParams::State
{
    std::wstring title;
    std::wstring message;
    std::wstring comment;
};

OrvixFileListDialogParams::OrvixFileListDialogParams() = default;

OrvixFileListDialogParams::~OrvixFileListDialogParams()
{
    delete m_state;
}

void OrvixFileListDialogParams::SetOptions(std::uint32_t options)
{
    m_options = options;
}

std::uint32_t OrvixFileListDialogParams::GetOptions()
{
    return m_options;
}

const wchar_t* OrvixFileListDialogParams::GetTitle()
{
    return TextOf(m_state, &State::title);
}

void OrvixFileListDialogParams::SetTitle(const wchar_t* title)
{
    SetText(m_state, &State::title, title);
}

const wchar_t* OrvixFileListDialogParams::GetMessageW()
{
    return TextOf(m_state, &State::message);
}

void OrvixFileListDialogParams::SetMessage(const wchar_t* message)
{
    SetText(m_state, &State::message, message);
}

OrvixFileList* OrvixFileListDialogParams::GetOrvixFileList()
{
    return m_fileList;
}

void OrvixFileListDialogParams::SetOrvixFileList(OrvixFileList* list)
{
    m_fileList = list;
}

const wchar_t* OrvixFileListDialogParams::GetComment()
{
    return TextOf(m_state, &State::comment);
}

void OrvixFileListDialogParams::SetComment(const wchar_t* comment)
{
    SetText(m_state, &State::comment, comment);
}

std::int32_t OrvixFileListDialogParams::GetDialogPromptID()
{
    return m_dialogPromptID;
}

void OrvixFileListDialogParams::SetDialogPromptID(std::int32_t id)
{
    m_dialogPromptID = id;
}

std::int32_t OrvixFileListDialogParams::GetOptionPromptID()
{
    return m_optionPromptID;
}

void OrvixFileListDialogParams::SetOptionPromptID(std::int32_t id)
{
    m_optionPromptID = id;
}
