#include "UniqueHandle.h"

#include "ImportHook.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <bit>
#include <type_traits>
#include <utility>
#include <vector>

using testing::ElementsAre;
using testing::IsEmpty;

namespace
{

/// Handles that are numbers, of which -1 means none. Closing one notes it and changes the thread's last error.
struct NumberPolicy
{
    using Handle = int;
    static Handle None() noexcept { return -1; }
    static void Close(Handle handle)
    {
        closed.push_back(handle);
        SetLastError(ERROR_INVALID_HANDLE);
    }

    static inline std::vector<int> closed;
};
using Number = UniqueHandle<NumberPolicy>;

class UniqueHandleTest : public testing::Test
{
protected:
    UniqueHandleTest() { NumberPolicy::closed.clear(); }

    const std::vector<int>& Closed() const { return NumberPolicy::closed; }
};

} // namespace

TEST_F(UniqueHandleTest, ClosesItsHandleOnceAtTheEnd)
{
    {
        const Number handle(7);
        EXPECT_TRUE(handle);
        EXPECT_EQ(handle.Get(), 7);
        EXPECT_THAT(Closed(), IsEmpty());
    }
    EXPECT_THAT(Closed(), ElementsAre(7));
}

TEST_F(UniqueHandleTest, IsEmptyByDefaultAndForTheValueThatMeansNone)
{
    {
        const Number byDefault;
        const Number none(NumberPolicy::None());
        EXPECT_FALSE(byDefault);
        EXPECT_FALSE(none);
        EXPECT_EQ(byDefault.Get(), NumberPolicy::None());
    }
    EXPECT_THAT(Closed(), IsEmpty());
}

TEST_F(UniqueHandleTest, ClosesAHandleThatIsNullWhereNullIsNotNone)
{
    {
        const Number zero(0);
        EXPECT_TRUE(zero);
    }
    EXPECT_THAT(Closed(), ElementsAre(0));
}

TEST_F(UniqueHandleTest, MovesToANewOwnerWhichClosesOnce)
{
    {
        Number from(7);
        const Number to(std::move(from));
        EXPECT_FALSE(from); // NOLINT(bugprone-use-after-move, clang-analyzer-cplusplus.Move): that is promised
        EXPECT_EQ(to.Get(), 7);
    }
    EXPECT_THAT(Closed(), ElementsAre(7));
}

TEST_F(UniqueHandleTest, ClosesTheOldHandleWhenItTakesAnother)
{
    {
        Number handle(1);
        handle = Number(2);
        EXPECT_THAT(Closed(), ElementsAre(1));
        EXPECT_EQ(handle.Get(), 2);
    }
    EXPECT_THAT(Closed(), ElementsAre(1, 2));
}

TEST_F(UniqueHandleTest, KeepsItsHandleWhenItIsMovedIntoItself)
{
    {
        Number handle(7);
        Number& same = handle;
        handle = std::move(same);
        EXPECT_EQ(handle.Get(), 7);
        EXPECT_THAT(Closed(), IsEmpty());
    }
    EXPECT_THAT(Closed(), ElementsAre(7));
}

TEST_F(UniqueHandleTest, ResetClosesTheOldHandleAndTakesTheNewOne)
{
    Number handle(1);
    handle.Reset(2);
    EXPECT_THAT(Closed(), ElementsAre(1));
    EXPECT_EQ(handle.Get(), 2);
    handle.Reset();
    EXPECT_FALSE(handle);
    handle.Reset();
    EXPECT_THAT(Closed(), ElementsAre(1, 2));
}

TEST_F(UniqueHandleTest, ReleaseLeavesTheHandleOpenForTheCaller)
{
    {
        Number handle(7);
        EXPECT_EQ(handle.Release(), 7);
        EXPECT_FALSE(handle);
    }
    EXPECT_THAT(Closed(), IsEmpty());
}

TEST_F(UniqueHandleTest, OutClosesTheOldHandleBeforeAFunctionStoresTheNext)
{
    {
        Number handle(1);
        int* const place = handle.Out();
        EXPECT_THAT(Closed(), ElementsAre(1));
        EXPECT_EQ(*place, NumberPolicy::None());
        *place = 2;
        EXPECT_EQ(handle.Get(), 2);
    }
    EXPECT_THAT(Closed(), ElementsAre(1, 2));
}

TEST_F(UniqueHandleTest, KeepsTheThreadsLastErrorWhileItCloses)
{
    SetLastError(ERROR_FILE_NOT_FOUND);
    {
        Number handle(1);
        handle.Reset(2);
        handle = Number(3);
    }
    EXPECT_THAT(Closed(), ElementsAre(1, 2, 3));
    EXPECT_EQ(GetLastError(), DWORD{ERROR_FILE_NOT_FOUND});
}

TEST_F(UniqueHandleTest, IsMovedAndNeverCopied)
{
    EXPECT_FALSE(std::is_copy_constructible_v<Number>);
    EXPECT_FALSE(std::is_copy_assignable_v<Number>);
    EXPECT_TRUE(std::is_nothrow_move_constructible_v<Number>);
    EXPECT_TRUE(std::is_nothrow_move_assignable_v<Number>);
}

namespace
{

/// A policy of the library and the value that means none.
template <typename Policy, std::intptr_t None>
struct PolicyCase
{
    using Handle = typename Policy::Handle;
    using Unique = UniqueHandle<Policy>;
    static Handle NoHandle() { return std::bit_cast<Handle>(None); }
};

constexpr std::intptr_t Null = 0;
constexpr std::intptr_t InvalidHandle = -1; // INVALID_HANDLE_VALUE

// Each with the system's function that closes its handles.
struct Kernel : PolicyCase<KernelHandlePolicy, Null>
{
    static constexpr const char* CloseFunction = "CloseHandle";
};
struct File : PolicyCase<FileHandlePolicy, InvalidHandle>
{
    static constexpr const char* CloseFunction = "CloseHandle";
};
struct Find : PolicyCase<FindHandlePolicy, InvalidHandle>
{
    static constexpr const char* CloseFunction = "FindClose";
};
struct Module : PolicyCase<ModulePolicy, Null>
{
    static constexpr const char* CloseFunction = "FreeLibrary";
};
struct RegistryKey : PolicyCase<RegistryKeyPolicy, Null>
{
    static constexpr const char* CloseFunction = "RegCloseKey";
};
struct Activation : PolicyCase<ActivationContextPolicy, InvalidHandle>
{
    static constexpr const char* CloseFunction = "ReleaseActCtx";
};
struct LocalMemory : PolicyCase<LocalMemoryPolicy, Null>
{
    static constexpr const char* CloseFunction = "LocalFree";
};

/// Takes the place of a function of the system that closes handles, in this program, and notes what it is given.
class CloseWatch
{
public:
    explicit CloseWatch(const char* function)
        : m_hook(GetModuleHandleW(nullptr), function, reinterpret_cast<void*>(&Close))
    {
        s_closed.clear();
    }

    bool IsActive() const { return m_hook.IsActive(); }
    static const std::vector<const void*>& Closed() { return s_closed; }

private:
    static std::intptr_t Close(const void* handle)
    {
        s_closed.push_back(handle);
        return 0;
    }

    static inline std::vector<const void*> s_closed;
    ImportHook m_hook;
};

template <typename Case>
class HandlePolicy : public testing::Test
{
};
using Policies = testing::Types<Kernel, File, Find, Module, RegistryKey, Activation, LocalMemory>;
TYPED_TEST_SUITE(HandlePolicy, Policies);

} // namespace

TYPED_TEST(HandlePolicy, ClosesWithItsOwnFunctionOfTheSystem)
{
    int target = 0;
    const CloseWatch watch(TypeParam::CloseFunction);
    ASSERT_TRUE(watch.IsActive());
    {
        const typename TypeParam::Unique handle(reinterpret_cast<typename TypeParam::Handle>(&target));
        EXPECT_TRUE(handle);
    }
    EXPECT_THAT(CloseWatch::Closed(), ElementsAre(&target));
}

TYPED_TEST(HandlePolicy, KnowsTheValueThatMeansNone)
{
    const CloseWatch watch(TypeParam::CloseFunction);
    {
        const typename TypeParam::Unique byDefault;
        EXPECT_EQ(byDefault.Get(), TypeParam::NoHandle());
        const typename TypeParam::Unique none(TypeParam::NoHandle());
        EXPECT_FALSE(none);
    }
    EXPECT_THAT(CloseWatch::Closed(), IsEmpty());
}
