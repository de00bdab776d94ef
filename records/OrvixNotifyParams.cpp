#include "OrvixNotifyParams.h"

OrvixNotifyParams::OrvixNotifyParams() = default;
OrvixNotifyParams::~OrvixNotifyParams() = default;

std::uint32_t OrvixNotifyParams::GetID()
{
    return m_id;
}

void OrvixNotifyParams::SetID(std::uint32_t id)
{
    m_id = id;
}

std::uint32_t OrvixNotifyParams::GetProviderIndex()
{
    return m_providerIndex;
}

void OrvixNotifyParams::SetProviderIndex(std::uint32_t index)
{
    m_providerIndex = index;
}

bool OrvixNotifyParams::IsCancelled()
{
    return m_cancelled;
}

void OrvixNotifyParams::SetCancelled(bool cancelled)
{
    m_cancelled = cancelled;
}

OrvixFileList* OrvixNotifyParams::GetOrvixFileList()
{
    return m_fileList;
}

void OrvixNotifyParams::SetOrvixFileList(OrvixFileList* list)
{
    m_fileList = list;
}
