// Reference-counted objects of the core object library.
//
// Object is the abstract interface (IncRef, DecRef, ToString, GetRefCount, in that vtable order).
// ObjectImpl implements it with an atomic count as its first data member. A new ObjectImpl holds
// no reference; IncRef adds one, DecRef removes one and destroys the object when none is left.
// FirstIncRef is called when the count goes from 0 to 1, FinalDecRef when it goes from 1 to 0;
// the default FinalDecRef deletes the object. Objects must be created with new.
#pragma once

#include <atomic>
#include <cstdint>
#include <string>
#include <typeinfo>

namespace Plinth {

class Object {
public:
    virtual void IncRef() const = 0;
    virtual void DecRef() const = 0;
    virtual std::string ToString() = 0;
    virtual int GetRefCount() const = 0;

protected:
    Object() = default;
    Object(const Object&) = default;
    Object& operator=(const Object&) = default;
    ~Object() = default;  // objects are destroyed through ObjectImpl's virtual destructor
};

class ObjectImpl : public virtual Object {
public:
    ObjectImpl() noexcept;
    // A copy is a new object: it starts with no reference.
    ObjectImpl(const ObjectImpl&) noexcept;
    ObjectImpl& operator=(const ObjectImpl&) noexcept { return *this; }

    void IncRef() const override;
    void DecRef() const override;
    std::string ToString() override;
    int GetRefCount() const override;
    virtual ~ObjectImpl();
    virtual void FirstIncRef(std::type_info const& type);
    virtual void FinalDecRef(std::type_info const& type);

    // Number of ObjectImpl instances alive in the process (for leak checks in tests).
    static long LiveObjects() noexcept;

private:
    mutable std::atomic<int> refCount_;
};

}  // namespace Plinth
