#include "OrvixFileListDialogParams.h"

#include "AssignText.h"

OrvixFileListDialogParams::OrvixFileListDialogParams() = default;
OrvixFileListDialogParams::~OrvixFileListDialogParams() = default;

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
    return m_title.c_str();
}

void OrvixFileListDialogParams::SetTitle(const wchar_t* title)
{
    AssignText(m_title, title);
}

const wchar_t* OrvixFileListDialogParams::GetMessageW()
{
    return m_message.c_str();
}

void OrvixFileListDialogParams::SetMessage(const wchar_t* message)
{
    AssignText(m_message, message);
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
    return m_comment.c_str();
}

void OrvixFileListDialogParams::SetComment(const wchar_t* comment)
{
    AssignText(m_comment, comment);
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
