#include "Host/Linux/UniqueFd.h"

#include <gtest/gtest.h>

#include <fcntl.h>

#include <cerrno>
#include <type_traits>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

static_assert(!std::is_copy_constructible_v<UniqueFd> && !std::is_copy_assignable_v<UniqueFd>);
static_assert(std::is_nothrow_move_constructible_v<UniqueFd> && std::is_nothrow_move_assignable_v<UniqueFd>);

int openNull() { return ::open("/dev/null", O_RDONLY | O_CLOEXEC); }
bool isOpen(int descriptor) { return ::fcntl(descriptor, F_GETFD) >= 0; }

TEST(UniqueFd, OwnsNothingAtFirstOrAfterAFailedCall) {
    EXPECT_FALSE(UniqueFd());
    EXPECT_EQ(UniqueFd().get(), -1);
    EXPECT_EQ(UniqueFd(-5).get(), -1);
}

TEST(UniqueFd, ClosesWhatItOwnsInTheEnd) {
    const int number = openNull();
    {
        const UniqueFd owner(number);
        EXPECT_TRUE(owner);
        EXPECT_EQ(owner.get(), number);
        EXPECT_TRUE(isOpen(number));
    }
    EXPECT_FALSE(isOpen(number));
}

TEST(UniqueFd, HandsOverWhenItIsMoved) {
    const int first = openNull(), second = openNull();
    UniqueFd owner(first), other(second);
    owner = std::move(other);
    EXPECT_FALSE(isOpen(first));
    EXPECT_EQ(owner.get(), second);
    const UniqueFd third(std::move(owner));
    EXPECT_EQ(third.get(), second);
    EXPECT_TRUE(isOpen(second));
}

TEST(UniqueFd, MayBeMovedToItself) {
    const int number = openNull();
    UniqueFd owner(number);
    UniqueFd &same = owner;
    owner = std::move(same);
    EXPECT_EQ(owner.get(), number);
    EXPECT_TRUE(isOpen(number));
}

TEST(UniqueFd, ReleasesWithoutClosing) {
    UniqueFd owner(openNull());
    const int number = owner.release();
    EXPECT_FALSE(owner);
    EXPECT_TRUE(isOpen(number));
    owner.reset(number);
    owner.reset();
    EXPECT_FALSE(isOpen(number));
}

TEST(UniqueFd, LeavesErrnoAsItWas) {
    UniqueFd owner(openNull());
    UniqueFd stranger(1 << 20); // no such descriptor: closing it fails
    errno = ENODEV;
    owner.reset();
    stranger.reset();
    EXPECT_EQ(errno, ENODEV);
}

} // namespace
} // namespace ZorvaTouch::Linux
