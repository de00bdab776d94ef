#include "GitLocks.h"

#include "GitFailure.h"
#include "GitText.h"

namespace
{

constexpr std::chrono::minutes Freshness(1);
constexpr int StepsAtOnce = 100;

GitCommand Question()
{
    return {.arguments = {L"lfs", L"locks", L"--verify"}, .isQuery = true, .task = L"Reading the locks of the server"};
}

/// Git LFS takes the paths of locks nowhere else than on the command line, one at a time.
GitCommand ForFile(const wchar_t* verb, const std::string& path, const wchar_t* task)
{
    const std::wstring file = GitText::FromUtf8(path);
    return {.arguments = {L"lfs", verb, L"--", file}, .task = task + file};
}

std::string_view Trimmed(std::string_view text)
{
    const std::size_t begin = text.find_first_not_of(" \r");
    const std::size_t end = text.find_last_not_of(" \r");
    return begin == std::string_view::npos ? std::string_view() : text.substr(begin, end - begin + 1);
}

} // namespace

void GitLocks::Reset(bool hasLockableFiles)
{
    m_inUse = hasLockableFiles;
    m_locks.clear();
    m_question.reset();
    m_asked = {};
}

void GitLocks::Refresh(const GitRunner& runner)
{
    if (!m_inUse)
    {
        return;
    }
    m_question.reset();
    m_asked = std::chrono::steady_clock::now();
    try
    {
        Read(runner.Run(Question()));
    }
    catch (const GitFailure&)
    {
        return; // the locks last seen count
    }
}

void GitLocks::RefreshInBackground(const GitRunner& runner)
{
    if (!m_inUse)
    {
        return;
    }
    // Each step is short. The last ones of a program move no bytes.
    for (int i = 0; m_question && i < StepsAtOnce; ++i)
    {
        if (!m_question->Step(0, nullptr))
        {
            Read(m_question->Result());
            m_question.reset();
        }
    }
    const auto now = std::chrono::steady_clock::now();
    if (!m_question && now - m_asked >= Freshness)
    {
        m_asked = now;
        try
        {
            m_question = std::make_unique<Process>(runner.MakeProcess(Question()));
        }
        catch (const GitFailure&)
        {
            return; // the locks last seen count
        }
    }
}

const GitLocks::Lock* GitLocks::Find(std::string_view path) const
{
    const auto found = m_locks.find(std::string(path));
    return found != m_locks.end() ? &found->second : nullptr;
}

void GitLocks::Take(const GitRunner& runner, const std::string& path)
{
    const Lock* lock = Find(path);
    if (lock != nullptr && !lock->isOurs)
    {
        throw GitFailure(GitText::FromUtf8(path) + L" is locked by " + lock->owner);
    }
    m_inUse = true; // the first lockable file may be new in this session
    if (lock == nullptr)
    {
        runner.RunOrThrow(ForFile(L"lock", path, L"Locking "));
        m_locks[path] = {true, L""};
    }
}

void GitLocks::GiveBack(const GitRunner& runner, const std::string& path)
{
    const Lock* lock = Find(path);
    if (lock != nullptr && lock->isOurs)
    {
        const ProcessResult result = runner.Run(ForFile(L"unlock", path, L"Unlocking "));
        if (!result.Succeeded())
        {
            // Git LFS gives back the lock of a file that is not on the disk, and then fails.
            Refresh(runner);
            if (const Lock* left = Find(path); left != nullptr && left->isOurs)
            {
                throw GitFailure(GitRunner::Words(result));
            }
            return;
        }
        m_locks.erase(path);
        m_question.reset(); // its answer may still have the lock
    }
}

/// Each line is "O path<tab>owner<tab>ID:number", with a space in place of "O" for the lock of another user; spaces
/// fill the columns.
void GitLocks::Read(const ProcessResult& result)
{
    if (!result.Succeeded())
    {
        return;
    }
    m_locks.clear();
    for (const std::string_view line : GitText::Split(result.output, '\n'))
    {
        const std::vector<std::string_view> columns = GitText::Split(line, '\t');
        if (columns.size() >= 3 && columns[0].size() > 2)
        {
            const std::string path(Trimmed(columns[0].substr(2)));
            m_locks[path] = {columns[0].front() == 'O', GitText::FromUtf8(Trimmed(columns[1]))};
        }
    }
}
