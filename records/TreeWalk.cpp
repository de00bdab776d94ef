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
        const std::size_t depth = m_path.size();
        OrvixFileEntry* entry = m_path.back().entry;
        const unsigned int position = m_path.back().nextChild;
        const bool hasNext = position < entry->NumChildren();
        if (m_path.size() < depth)
        {
            continue;
        }
        if (!hasNext)
        {
            Pop();
            continue;
        }
        m_path.back().nextChild = position + 1;
        OrvixFileEntry* child = entry->GetChild(position);
        if (child == nullptr || m_path.size() < depth)
        {
            continue;
        }
        if (child != target)
        {
            Push(child);
            continue;
        }
        entry->RemoveChild(position);
        if (m_path.size() == depth)
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
