// Twelve properties as a calling party has them: the container of call control beside the standard library's maps.
#include "CallScenario.h"
#include "properties/CC_PropertyCallLegState.h"
#include "properties/CC_PropertyContainer.h"
#include "properties/CC_PropertyId.h"
#include "properties/CC_PropertyString.h"
#include "properties/CC_PropertyUnsigned.h"

#include <array>
#include <benchmark/benchmark.h>
#include <map>
#include <string>
#include <unordered_map>
#include <utility>
#include <variant>
#include <vector>

namespace
{
using Value = std::variant<unsigned long long, std::string>;

struct Entry
{
    unsigned int id;
    std::array<Value, 2> values; ///< before and after a change
};

std::array<Entry, 12> const ENTRIES = {{
    {CC_PropertyId::NETWORK, {"left", "right"}},
    {CC_PropertyId::CALL_LEG_ID, {0x55d0c0ffee00ULL, 0x55d0c0ffef00ULL}},
    {CC_PropertyId::E164_NUMBER, {"4989123", "4420791234"}},
    {CC_PropertyId::TYPE_OF_NUMBER, {1ULL, 2ULL}},
    {CC_PropertyId::NUMBERING_PLAN, {1ULL, 9ULL}},
    {CC_PropertyId::PRESENTATION_INDICATOR, {0ULL, 1ULL}},
    {CC_PropertyId::SCREENING_INDICATOR, {3ULL, 1ULL}},
    {CC_PropertyId::NAME, {"Ada Lovelace", "A. Lovelace"}},
    {CC_PropertyId::URI, {"sip:ada.lovelace@example.com", "sip:a.lovelace@example.com"}}, // longer than a string holds
    {CC_PropertyId::HOPS, {16ULL, 15ULL}},
    {CC_PropertyId::CAUSE, {16ULL, 17ULL}},
    {CC_PropertyId::STATE, {6ULL, 0ULL}},
}};

/// Properties made once, as a module hands them over: in two sets that differ in every value.
class PropertyContainer
{
public:
    PropertyContainer()
    {
        for (std::size_t set : {0U, 1U})
            for (Entry const& entry : ENTRIES)
                if (auto const* const text = std::get_if<std::string>(&entry.values[set]))
                    MUST(m_sets[set].set(CC_PropertyString(entry.id, String(*text))), "set");
                else
                    MUST(m_sets[set].set(CC_PropertyUnsigned(entry.id, std::get<0>(entry.values[set]))), "set");
        m_stored = m_sets[0];
    }

    bool lookUp(unsigned int id) const { return m_stored.get(id) != nullptr; }
    unsigned int replaceAll(std::size_t set)
    {
        unsigned int replaced = 0;
        for (CC_Property const& property : m_sets[set])
        {
            CC_Property const* const stored = m_stored.get(property.getId());
            if (stored != nullptr && stored->isEqual(property))
                continue;
            MUST(m_stored.set(property), "set");
            ++replaced;
        }
        return replaced;
    }
    std::size_t copy() const
    {
        CC_PropertyContainer const copied(m_stored);
        benchmark::DoNotOptimize(copied);
        return copied.getNumberOfProperties();
    }

private:
    CC_PropertyContainer m_sets[2];
    CC_PropertyContainer m_stored;
};

template <class Map>
class StandardMap
{
public:
    StandardMap()
    {
        for (std::size_t set : {0U, 1U})
            for (Entry const& entry : ENTRIES)
                m_sets[set].emplace_back(entry.id, entry.values[set]);
        m_stored.insert(m_sets[0].begin(), m_sets[0].end());
    }

    bool lookUp(unsigned int id) const { return m_stored.find(id) != m_stored.end(); }
    unsigned int replaceAll(std::size_t set)
    {
        unsigned int replaced = 0;
        for (auto const& [id, value] : m_sets[set])
        {
            auto const stored = m_stored.find(id);
            if (stored != m_stored.end() && stored->second == value)
                continue;
            if (stored != m_stored.end())
                stored->second = value;
            else
                m_stored.emplace(id, value);
            ++replaced;
        }
        return replaced;
    }
    std::size_t copy() const
    {
        Map const copied(m_stored);
        benchmark::DoNotOptimize(copied);
        return copied.size();
    }

private:
    std::vector<std::pair<unsigned int, Value>> m_sets[2];
    Map m_stored;
};

template <class Container>
void LOOK_UP(benchmark::State& state)
{
    Container const container;
    unsigned int found = 0;
    for (auto _ : state)
        for (Entry const& entry : ENTRIES)
        {
            unsigned int id = entry.id;
            benchmark::DoNotOptimize(id);
            found += container.lookUp(id);
        }
    MUST(found == static_cast<unsigned int>(static_cast<std::size_t>(state.iterations()) * ENTRIES.size()),
         "finding every property");
    state.SetItemsProcessed(state.iterations() * static_cast<long>(ENTRIES.size()));
}

template <class Container, bool IS_CHANGED>
void REPLACE(benchmark::State& state)
{
    Container container;
    std::size_t set = 0;
    bool isAsExpected = true;
    for (auto _ : state)
    {
        set = IS_CHANGED ? 1 - set : 0;
        isAsExpected &= container.replaceAll(set) == (IS_CHANGED ? ENTRIES.size() : 0);
    }
    MUST(isAsExpected, "replacing what differs and nothing else");
    state.SetItemsProcessed(state.iterations() * static_cast<long>(ENTRIES.size()));
}

template <class Container>
void COPY(benchmark::State& state)
{
    Container const container;
    bool isWhole = true;
    for (auto _ : state)
        isWhole &= container.copy() == ENTRIES.size();
    MUST(isWhole, "copying every property");
    state.SetItemsProcessed(state.iterations() * static_cast<long>(ENTRIES.size()));
}

using OrderedMap = StandardMap<std::map<unsigned int, Value>>;
using UnorderedMap = StandardMap<std::unordered_map<unsigned int, Value>>;

BENCHMARK(LOOK_UP<PropertyContainer>)->Name("Container/LookUp/CC_PropertyContainer");
BENCHMARK(LOOK_UP<OrderedMap>)->Name("Container/LookUp/map");
BENCHMARK(LOOK_UP<UnorderedMap>)->Name("Container/LookUp/unordered_map");
BENCHMARK(REPLACE<PropertyContainer, true>)->Name("Container/Replace/CC_PropertyContainer");
BENCHMARK(REPLACE<OrderedMap, true>)->Name("Container/Replace/map");
BENCHMARK(REPLACE<UnorderedMap, true>)->Name("Container/Replace/unordered_map");
BENCHMARK(REPLACE<PropertyContainer, false>)->Name("Container/Keep/CC_PropertyContainer");
BENCHMARK(REPLACE<OrderedMap, false>)->Name("Container/Keep/map");
BENCHMARK(REPLACE<UnorderedMap, false>)->Name("Container/Keep/unordered_map");
BENCHMARK(COPY<PropertyContainer>)->Name("Container/Copy/CC_PropertyContainer");
BENCHMARK(COPY<OrderedMap>)->Name("Container/Copy/map");
BENCHMARK(COPY<UnorderedMap>)->Name("Container/Copy/unordered_map");
} // namespace
