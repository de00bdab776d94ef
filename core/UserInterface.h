#pragma once

class IOrvixClientAccess;
class IOrvixCoreUI;
class IOrvixCoreUIClientAccess;

/// How a services object reaches people: the host's access, and the user-interface library, which is obtained on first
/// use and handed back when this object is destroyed.
class UserInterface
{
public:
    /// `relay` is what the user-interface library gets; it outlives this object.
    explicit UserInterface(IOrvixCoreUIClientAccess& relay) : m_relay(relay) {}
    UserInterface(const UserInterface&) = delete;
    UserInterface& operator=(const UserInterface&) = delete;
    ~UserInterface();

    /// The host's access; null when the host gave none. Not owned.
    IOrvixClientAccess* ClientAccess() const { return m_clientAccess; }
    void SetClientAccess(IOrvixClientAccess* access) { m_clientAccess = access; }

    /// Whether the host says that nobody can answer.
    bool IsUnattended() const;

    IOrvixCoreUI& CoreUI();

private:
    IOrvixCoreUIClientAccess& m_relay;
    IOrvixClientAccess* m_clientAccess = nullptr;
    IOrvixCoreUI* m_coreUI = nullptr;
};
