#include "UserInterface.h"

#include "IOrvixClientAccess.h"
#include "IOrvixCoreUI.h"

UserInterface::~UserInterface()
{
    if (m_coreUI != nullptr)
    {
        ReleaseIOrvixCoreUI(m_coreUI);
    }
}

bool UserInterface::IsUnattended() const
{
    return m_clientAccess != nullptr && m_clientAccess->IsUnattended();
}

IOrvixCoreUI& UserInterface::CoreUI()
{
    if (m_coreUI == nullptr)
    {
        m_coreUI = GetIOrvixCoreUI();
        m_coreUI->SetClientAccess(&m_relay);
    }
    return *m_coreUI;
}
