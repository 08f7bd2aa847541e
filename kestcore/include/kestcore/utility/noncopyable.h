#pragma once

namespace kestcore {
namespace utility {

// Base class that forbids copy construction and copy assignment.
class noncopyable {
protected:
    noncopyable() = default;
    ~noncopyable() = default;

public:
    noncopyable(const noncopyable&) = delete;
    noncopyable& operator=(const noncopyable&) = delete;
};

}  // namespace utility
}  // namespace kestcore
