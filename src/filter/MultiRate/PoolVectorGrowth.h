#pragma once

#include <algorithm>
#include <cstddef>
#include <stdexcept>

// Growth of the multi-rate filter's vectors. The pool behind them is sized by
// this library's own rule rather than the standard library's: a vector that
// runs out of capacity takes the larger of the new size and one and a half
// times its old capacity, and a size beyond what the element type can address
// throws std::length_error("vector too long") before anything is allocated.
// reserve() allocates exactly what it is asked for, so the rule is applied
// here and the container never chooses a capacity itself.
namespace kestaccel {
namespace filter {
namespace cpp {

template <class Vector>
std::size_t GrownCapacity(const Vector& vector, std::size_t requiredSize)
{
    const std::size_t limit = vector.max_size();
    if (requiredSize > limit) {
        throw std::length_error("vector too long");
    }
    const std::size_t capacity = vector.capacity();
    const std::size_t geometric = capacity > limit - capacity / 2 ? limit : capacity + capacity / 2;
    return std::max(geometric, requiredSize);
}

// Makes the vector at least `size` elements long; new elements are zero
// (value-initialised). Never shrinks.
template <class Vector>
void PoolVectorGrowTo(Vector& vector, std::size_t size)
{
    if (size <= vector.size()) {
        return;
    }
    if (size > vector.capacity()) {
        vector.reserve(GrownCapacity(vector, size));
    }
    vector.resize(size);
}

template <class Vector, class Value>
void PoolVectorAppend(Vector& vector, const Value& value)
{
    if (vector.size() == vector.capacity()) {
        vector.reserve(GrownCapacity(vector, vector.size() + 1));
    }
    vector.push_back(value);
}

}  // namespace cpp
}  // namespace filter
}  // namespace kestaccel
