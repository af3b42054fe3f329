// Owning handles for reference-counted objects.
//
// Ref<T> holds at most one reference to a T (any class with IncRef/DecRef). Constructing or
// assigning from a raw pointer takes a reference; copying takes another; moving transfers it;
// destruction, Reset and reassignment release the held one. RefVector<T> is a sequence of Ref<T>.
#pragma once

#include <cstddef>
#include <utility>
#include <vector>

namespace Plinth {

template <typename T>
class Ref {
public:
    Ref() noexcept = default;
    Ref(std::nullptr_t) noexcept {}
    explicit Ref(T* object) : ptr_(object) {
        if (ptr_) ptr_->IncRef();
    }
    Ref(const Ref& other) : ptr_(other.ptr_) {
        if (ptr_) ptr_->IncRef();
    }
    Ref(Ref&& other) noexcept : ptr_(other.ptr_) { other.ptr_ = nullptr; }
    template <typename U>
    Ref(const Ref<U>& other) : ptr_(other.Get()) {
        if (ptr_) ptr_->IncRef();
    }
    ~Ref() { Reset(); }

    Ref& operator=(const Ref& other) {
        Ref(other).Swap(*this);
        return *this;
    }
    Ref& operator=(Ref&& other) noexcept {
        Ref(std::move(other)).Swap(*this);
        return *this;
    }
    // Takes a reference on `object` first, then releases the one held before.
    void Assign(T* object) { Ref(object).Swap(*this); }

    void Reset() noexcept {
        T* old = ptr_;
        ptr_ = nullptr;
        if (old) old->DecRef();
    }
    void Swap(Ref& other) noexcept { std::swap(ptr_, other.ptr_); }

    T* Get() const noexcept { return ptr_; }
    T* operator->() const noexcept { return ptr_; }
    T& operator*() const noexcept { return *ptr_; }
    explicit operator bool() const noexcept { return ptr_ != nullptr; }

private:
    T* ptr_ = nullptr;
};

template <typename T>
class RefVector : public std::vector<Ref<T>> {
public:
    using std::vector<Ref<T>>::vector;
    // Appends a new entry holding a reference to `object`.
    void Append(T* object) { this->emplace_back(object); }
};

}  // namespace Plinth
