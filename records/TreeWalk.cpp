#include "TreeWalk.h"

#include <algorithm>

TreeWalk::TreeWalk(TreeWalk*& innermost, unsigned long long number)
    : m_innermost(innermost), m_outer(innermost), m_number(number)
{
    innermost = this;
}

TreeWalk::~TreeWalk()
{
    Forget(nullptr); // what an exception left
    m_innermost = m_outer;
}

void TreeWalk::Detach(OrvixFileEntry* root, const OrvixFileEntry* target)
{
    Push(root);
    while (!m_path.empty())
    {
        OrvixFileEntry* entry = nullptr;
        OrvixFileEntry* child = nullptr;
        const Found found = Advance(entry, child);
        if (found == Found::Child && child == target)
        {
            const std::size_t depth = m_path.size();
            entry->RemoveChild(m_path.back().nextChild - 1);
            if (m_path.size() == depth)
            {
                Pop();
            }
        }
        else if (found == Found::Child)
        {
            Push(child);
        }
        else if (found == Found::End)
        {
            Pop();
        }
    }
}

void TreeWalk::Forget(const OrvixFileEntry* entry)
{
    const auto onPath = [entry](const Step& step) { return entry == nullptr || step.entry == entry; };
    const auto first = std::find_if(m_path.begin(), m_path.end(), onPath);
    // The entries below it are alive: a host that deletes a tree deletes the lower ones first.
    for (auto count = m_path.end() - first; count > 0; --count)
    {
        Pop();
    }
}
