#pragma once

#include "Plugin/ZorvaPlugIn.h"

#include <type_traits>
#include <utility>

namespace ZorvaTouch {

/// A reference to an object of the boundary, whoever made it; may be null.
///
/// Threads: as the object.
template <typename Object> class Ref {
public:
    Ref() noexcept = default;
    /// Takes over a reference, such as a function called copy or create returns.
    [[nodiscard]] static Ref adopt(Object *object) noexcept {
        Ref ref;
        ref._object = object;
        return ref;
    }
    /// Adds a reference.
    [[nodiscard]] static Ref retain(Object *object) noexcept {
        if (object)
            object->table->retain(object);
        return adopt(object);
    }

    Ref(const Ref &other) noexcept : Ref(retain(other._object)) {}
    Ref(Ref &&other) noexcept : _object(std::exchange(other._object, nullptr)) {}
    /// From a reference to what is such an object and more.
    template <typename Derived>
    requires std::is_base_of_v<Object, Derived> Ref(Ref<Derived> other)
    noexcept : _object(other.release()) {}
    Ref &operator=(Ref other) noexcept {
        std::swap(_object, other._object);
        return *this;
    }
    ~Ref() { reset(); }

    void reset() noexcept {
        if (Object *const object = std::exchange(_object, nullptr))
            object->table->release(object);
    }
    /// Hands the reference over to the caller.
    [[nodiscard]] Object *release() noexcept { return std::exchange(_object, nullptr); }

    [[nodiscard]] Object *get() const noexcept { return _object; }
    [[nodiscard]] explicit operator bool() const noexcept { return _object != nullptr; }
    Object *operator->() const noexcept { return _object; }

private:
    Object *_object = nullptr;
};

} // namespace ZorvaTouch
