#include "ModulePath.h"

#include <gtest/gtest.h>

#include <process.h>

#include <filesystem>

TEST(NotificationAtTheEndOfTheProcess, FindsNoListenerAnyMore)
{
    const std::filesystem::path program =
        std::filesystem::path(ModulePath(nullptr)).parent_path() / "ending_process.exe";
    EXPECT_EQ(_wspawnl(_P_WAIT, program.c_str(), L"ending_process", nullptr), 0);
}
