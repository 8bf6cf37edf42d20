#pragma once

#include "Plugin/Ref.h"
#include "Plugin/ReferenceCount.h"

#include <type_traits>

namespace ZorvaTouch {

/// Base of a class whose objects cross the boundary: the boundary's structure, and a reference count.
///
///     class Device final : public BoundaryObject<Device, ZorvaDevice> { ... };
///
/// The class has its table as a static member, in which `retain` and `release` are the ones below, and its
/// functions find themselves with `of`. An object begins with one reference, its maker's.
template <typename Derived, typename Object> class BoundaryObject : public Object {
public:
    BoundaryObject(const BoundaryObject &) = delete;
    BoundaryObject &operator=(const BoundaryObject &) = delete;

    /// A new reference for somebody on this side.
    [[nodiscard]] Ref<Object> ref() noexcept { return Ref<Object>::retain(this); }

protected:
    explicit BoundaryObject(decltype(Object::table) objectTable) noexcept : Object{objectTable} {}
    ~BoundaryObject() = default;

    // Values and events are const to everybody; the count is not part of what they are.
    template <typename Borrowed> static void retain(Borrowed *object) noexcept {
        mutableOf(object).BoundaryObject::_references.retain();
    }
    template <typename Borrowed> static void release(Borrowed *object) noexcept {
        Derived &self = mutableOf(object);
        if (self.BoundaryObject::_references.release() == 0)
            delete &self;
    }
    [[nodiscard]] static Derived &of(Object *object) noexcept { return static_cast<Derived &>(*object); }
    [[nodiscard]] static const Derived &of(const Object *object) noexcept {
        return static_cast<const Derived &>(*object);
    }

private:
    template <typename Borrowed> static Derived &mutableOf(Borrowed *object) noexcept {
        return static_cast<Derived &>(const_cast<Object &>(*object));
    }

    ReferenceCount _references;
};

} // namespace ZorvaTouch
