#include "platform/base/InfoContainer.h"

#include <new>
#include <string>

void InfoContainer::add(unsigned int level, unsigned int detail, String const& key, String const& text)
{
    try
    {
        if (m_entries.append(Entry{level, detail, key, text}).isOk())
            return;
    }
    catch (std::bad_alloc const&)
    {
        // copying key or text failed: said by the mark below
    }
    m_isIncomplete = true;
}

void InfoContainer::addWithin(unsigned int maxLevel, unsigned int level, unsigned int maxDetail, unsigned int detail,
                              String const& prefix, char const* label, String const& text)
{
    if (level > maxLevel || detail > maxDetail)
        return;
    try
    {
        add(level, detail, prefix + label, text);
    }
    catch (std::bad_alloc const&)
    {
        m_isIncomplete = true;
    }
}

String InfoContainer::getString_TreeFormat() const
{
    String tree;
    getString_TreeFormat(tree, 0, 0, 0);
    return tree;
}

String& InfoContainer::getString_TreeFormat(String& out, unsigned int keyWidth, unsigned int margin,
                                            unsigned int baseLevel) const
{
    std::string tree;
    for (Entry const& entry : m_entries)
    {
        std::size_t const depth = entry.level > baseLevel ? entry.level - baseLevel : 0;
        std::size_t const begin = tree.size() + margin;
        tree.append(margin + 2 * depth, ' ').append(entry.key.view());
        if (!entry.text.isEmpty())
        {
            tree.push_back(':');
            std::size_t const column = tree.size() - begin;
            tree.append(column < keyWidth ? keyWidth - column : 1, ' ');
        }
        for (char const letter : entry.text.view())
        {
            tree.push_back(letter);
            if (letter == '\n')
                tree.append(margin + 2 * depth + 2, ' ');
        }
        tree.push_back('\n');
    }
    if (m_isIncomplete)
        tree.append("(incomplete: memory ran out)\n");
    return out = String(std::string_view(tree));
}
