#include "AllocationSweep.h"
#include "ImportHook.h"
#include "OrvixClientInfo.h"
#include "OrvixPrompt.h"
#include "OrvixServicesPointer.h"
#include "TempFolder.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <utility>
#include <vector>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

/// The objects that this program releases, in order. Each is released all the same.
class ReleasedServices
{
public:
    ReleasedServices() { s_current = this; }
    ReleasedServices(const ReleasedServices&) = delete;
    ReleasedServices& operator=(const ReleasedServices&) = delete;
    ~ReleasedServices() { s_current = nullptr; }

    bool IsActive() const { return m_hook.IsActive(); }

    std::vector<IOrvixServices*> released;

private:
    static void Release(IOrvixServices* services)
    {
        s_current->released.push_back(services);
        s_current->m_hook.Original<decltype(ReleaseIOrvixServices)>()(services);
    }

    static inline ReleasedServices* s_current = nullptr;
    ImportHook m_hook{GetModuleHandleW(nullptr), "ReleaseIOrvixServices", reinterpret_cast<void*>(&Release)};
};

class ServicesPointer : public testing::Test
{
protected:
    void SetUp() override { ASSERT_TRUE(m_watch.IsActive()); }

    ReleasedServices m_watch;
};

} // namespace

TEST_F(ServicesPointer, ReleasesItsObjectOnceAtTheEnd)
{
    const IOrvixServices* object = nullptr;
    {
        const OrvixServicesPointer services = MakeOrvixServices();
        object = services.get();
        ASSERT_NE(object, nullptr);
        EXPECT_THAT(m_watch.released, IsEmpty());
    }
    EXPECT_THAT(m_watch.released, ElementsAre(object));
}

TEST_F(ServicesPointer, ReleasesAMovedObjectOnceByTheNewOwner)
{
    const IOrvixServices* object = nullptr;
    {
        OrvixServicesPointer from = MakeOrvixServices();
        object = from.get();
        const OrvixServicesPointer to = std::move(from);
        EXPECT_EQ(to.get(), object);
    }
    EXPECT_THAT(m_watch.released, ElementsAre(object));
}

TEST_F(ServicesPointer, ReleasesNothingWhenItIsEmpty)
{
    {
        OrvixServicesPointer services;
        services.reset();
    }
    EXPECT_THAT(m_watch.released, IsEmpty());
}

TEST_F(ServicesPointer, SavesTheStoredAnswersAtTheEnd)
{
    const TempFolder config;
    OrvixClientInfo info;
    info.SetConfigFilePath(config.Text().c_str());
    {
        const OrvixServicesPointer services = MakeOrvixServices();
        services->Initialize(&info, 0);
        services->RegisterPrompt(1, L"Really?", OrvixPromptAction::Yes, 0, false);
    }
    EXPECT_TRUE(std::filesystem::exists(config.Path() / L"OrvixPrompts.xml"));
}

TEST_F(ServicesPointer, IsEmptyWhenMemoryIsExhausted)
{
    const long failures = SweepAllocations([](AllocationRound& round) {
        const OrvixServicesPointer services = round.Attempt([] { return MakeOrvixServices(); });
        EXPECT_EQ(services == nullptr, round.Failed());
    });
    EXPECT_GE(failures, 2);
}
