#pragma once

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <utility>
#include <vector>

/// A map from numbers to values that keeps its buckets in one piece of memory: an index over something that is kept
/// elsewhere. Nothing is ever taken out except all at once.
template <typename Key, typename Value>
class FlatMap
{
public:
    void Clear()
    {
        m_buckets.clear();
        m_count = 0;
    }

    /// Makes room for so many keys. Throws std::bad_alloc with nothing changed.
    void Reserve(std::size_t count)
    {
        const std::size_t wanted = std::bit_ceil(2 * std::max<std::size_t>(count, 8));
        if (wanted <= m_buckets.size())
        {
            return;
        }
        std::vector<Bucket> buckets(wanted);
        for (const Bucket& bucket : m_buckets)
        {
            if (bucket.used)
            {
                BucketOf(buckets, bucket.key) = bucket;
            }
        }
        m_buckets = std::move(buckets);
    }

    /// Null when the key is not there. Valid until the next key is added.
    Value* Find(Key key)
    {
        if (m_buckets.empty())
        {
            return nullptr;
        }
        Bucket& bucket = BucketOf(m_buckets, key);
        return bucket.used ? &bucket.value : nullptr;
    }

    /// The value of a key, and whether the key is new; a new key's value is `value`. Throws std::bad_alloc with nothing
    /// changed.
    std::pair<Value&, bool> Add(Key key, const Value& value)
    {
        Reserve(m_count + 1);
        Bucket& bucket = BucketOf(m_buckets, key);
        const bool isNew = !bucket.used;
        if (isNew)
        {
            bucket = {key, value, true};
            ++m_count;
        }
        return {bucket.value, isNew};
    }

private:
    struct Bucket
    {
        Key key = {};
        Value value = {};
        bool used = false;
    };

    /// The bucket of a key, or the free one where it would be.
    static Bucket& BucketOf(std::vector<Bucket>& buckets, Key key)
    {
        // Fibonacci hashing: the fraction of the golden ratio as a 64-bit number spreads neighbouring keys.
        constexpr std::uint64_t GoldenRatio = 0x9E3779B97F4A7C15;
        const std::uint64_t hash = static_cast<std::uint64_t>(key) * GoldenRatio;
        std::size_t place = static_cast<std::size_t>(hash >> (64 - std::countr_zero(buckets.size())));
        while (buckets[place].used && buckets[place].key != key)
        {
            place = (place + 1) & (buckets.size() - 1);
        }
        return buckets[place];
    }

    std::vector<Bucket> m_buckets; // a power of two, at least half of them free
    std::size_t m_count = 0;
};
