#pragma once

#include "NumberByHand.h"

#include <gtest/gtest.h>

#include <iterator>
#include <random>
#include <string>

/// Numbers that are the same in every run with the same seed, from every compiler.
class RandomNumbers
{
public:
    explicit RandomNumbers(unsigned int seed) : m_engine(seed) {}

    /// From 0 to `count` - 1.
    unsigned int Below(unsigned int count) { return static_cast<unsigned int>(m_engine() % count); }

    bool OneIn(unsigned int count) { return Below(count) == 0; }

    /// One of the items, which are not none.
    template <typename Items>
    auto& From(Items& items)
    {
        return items[Below(static_cast<unsigned int>(std::size(items)))];
    }

private:
    std::mt19937 m_engine;
};

inline unsigned int Seed()
{
    return NumberByHand(L"ORVIX_SEED", 1);
}

/// A plain model beside the real objects. `Step` does the same random operation to both and compares them.
class RandomModel
{
public:
    /// What differed first; empty while nothing has.
    const std::string& Difference() const { return m_difference; }

protected:
    explicit RandomModel(RandomNumbers& random) : m_random(random) {}

    void Expect(bool asInTheModel, const char* what)
    {
        if (!asInTheModel && m_difference.empty())
        {
            m_difference = what;
        }
    }

    RandomNumbers& m_random;

private:
    std::string m_difference;
};

template <typename Model>
void RunModel()
{
    const unsigned int seed = Seed();
    const unsigned int steps = NumberByHand(L"ORVIX_STEPS", 100000);
    RandomNumbers random(seed);
    Model model(random);
    for (unsigned int step = 0; step < steps; ++step)
    {
        model.Step();
        ASSERT_EQ(model.Difference(), "") << "seed " << seed << ", step " << step;
    }
}
