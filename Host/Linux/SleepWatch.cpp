#include "Host/Linux/SleepWatch.h"

#include "Host/Linux/BackOff.h"
#include "Host/Linux/UniqueFd.h"
#include "Shared/LogNames.h"

#include <fcntl.h>
#include <systemd/sd-bus.h>

#include <chrono>
#include <cstddef>
#include <cstdint>
#include <exception>
#include <string>
#include <string_view>
#include <system_error>
#include <utility>

namespace ZorvaTouch::Linux {
namespace {

constexpr const char *kBusName = "org.freedesktop.DBus";
constexpr const char *kBusPath = "/org/freedesktop/DBus";
constexpr const char *kLogindName = "org.freedesktop.login1";
constexpr const char *kLogindPath = "/org/freedesktop/login1";
constexpr const char *kManager = "org.freedesktop.login1.Manager";

/// The bus filters by these; whom a signal is from is looked at again, since one that is sent to us alone
/// does not pass the filter.
constexpr const char *kOwnerMatch =
    "type='signal',sender='org.freedesktop.DBus',path='/org/freedesktop/DBus',"
    "interface='org.freedesktop.DBus',member='NameOwnerChanged',arg0='org.freedesktop.login1'";
constexpr const char *kSleepMatch =
    "type='signal',sender='org.freedesktop.login1',path='/org/freedesktop/login1',"
    "interface='org.freedesktop.login1.Manager',member='PrepareForSleep'";
constexpr const char *kDisconnectedMatch =
    "type='signal',sender='org.freedesktop.DBus.Local',interface='org.freedesktop.DBus.Local',"
    "member='Disconnected'";

constexpr std::size_t kLongestError = 200;     ///< bytes
constexpr std::uint64_t kForEver = UINT64_MAX; ///< a late answer is as good as any

/// Lets go of sd-bus's objects. A bus is closed without waiting for what is still to be sent.
struct Unref {
    void operator()(sd_bus *bus) const noexcept { ::sd_bus_close_unref(bus); }
    void operator()(sd_bus_slot *slot) const noexcept { ::sd_bus_slot_unref(slot); }
    void operator()(sd_bus_message *message) const noexcept { ::sd_bus_message_unref(message); }
};
template <typename Object> using Owned = std::unique_ptr<Object, Unref>;

/// sd-bus's results: negative ones are an errno. Others become 0.
int errorOf(int result) noexcept { return result < 0 ? -result : 0; }

std::string_view senderOf(sd_bus_message *message) noexcept {
    const char *const sender = ::sd_bus_message_get_sender(message);
    return sender ? sender : "";
}

/// The descriptor in a message, as one of our own; none if there is none.
UniqueFd descriptorOf(sd_bus_message *message) noexcept {
    int descriptor = -1;
    if (::sd_bus_message_read(message, "h", &descriptor) <= 0)
        return UniqueFd();
    return UniqueFd(::fcntl(descriptor, F_DUPFD_CLOEXEC, 0));
}

/// What is wrong with an answer, not too long.
std::string describeError(sd_bus_message *reply) {
    const sd_bus_error *const error = ::sd_bus_message_get_error(reply);
    const std::string_view text = error && error->message ? error->message : "the answer is not understood";
    return std::string(text.substr(0, kLongestError));
}

} // namespace

/// The conversation with the bus and with logind.
class SleepWatch::Logind {
public:
    Logind(MainLoop &loop, std::shared_ptr<Ports::Log> log, Function onSleep, Function onWake,
           LoopTimer after)
        : _loop(loop), _log(std::move(log)), _onSleep(std::move(onSleep)), _onWake(std::move(onWake)),
          _after(after ? std::move(after) : loopTimer(loop)) {}

    void connect() {
        _pending.reset();
        _bus.reset();
        const int error = attach();
        if (error == 0)
            return;
        _bus.reset();
        tell("no system bus: " + std::generic_category().message(error));
        connectLater();
    }

    [[nodiscard]] bool isHoldingSleep() const noexcept { return static_cast<bool>(_inhibitor); }

private:
    using Handler = void (Logind::*)(sd_bus_message *);

    /// sd-bus's way into a handler. What is thrown must not pass through C: it ends the main loop.
    template <Handler handler>
    static int call(sd_bus_message *message, void *context, sd_bus_error *) noexcept {
        Logind &self = *static_cast<Logind *>(context);
        try {
            (self.*handler)(message);
        } catch (...) {
            self._loop.post([failure = std::current_exception()] { std::rethrow_exception(failure); });
        }
        return 0;
    }

    static LoopTimer loopTimer(MainLoop &loop) {
        return [&loop](std::chrono::microseconds delay, Function function) {
            return loop.after(delay, std::move(function));
        };
    }

    void connectLater() {
        _retry = _after(_backOff.next(), [this] { connect(); });
    }

    /// @return An errno, or 0.
    int attach() noexcept {
        sd_bus *bus = nullptr;
        if (const int error = errorOf(::sd_bus_open_system(&bus))) // goes on by itself
            return error;
        _bus.reset(bus);
        (void)::sd_bus_set_close_on_exit(bus, 0); // which would wait for the bus when the loop ends
        if (const int error = errorOf(::sd_bus_attach_event(bus, _loop.native(), SD_EVENT_PRIORITY_NORMAL)))
            return error;
        return listen();
    }

    /// First to changes, then what there is: nothing is missed in between.
    int listen() noexcept {
        sd_bus *const bus = _bus.get();
        for (const int result :
             {::sd_bus_add_match(bus, nullptr, kDisconnectedMatch, call<&Logind::disconnected>, this),
              ::sd_bus_add_match_async(bus, nullptr, kOwnerMatch, call<&Logind::ownerChanged>, nullptr, this),
              ::sd_bus_add_match_async(bus, nullptr, kSleepMatch, call<&Logind::prepareForSleep>, nullptr,
                                       this),
              ::sd_bus_call_method_async(bus, nullptr, kBusName, kBusPath, kBusName, "GetNameOwner",
                                         call<&Logind::ownerFound>, this, "s", kLogindName)})
            if (const int error = errorOf(result))
                return error;
        return 0;
    }

    // --- Who logind is -------------------------------------------------------------------------------------

    void ownerFound(sd_bus_message *reply) {
        if (isConnected()) // only a bus that answers resets the back-off
            _backOff.reset();
        const char *owner = "";
        if (!::sd_bus_message_is_method_error(reply, nullptr) &&
            ::sd_bus_message_read(reply, "s", &owner) > 0)
            logindIs(owner);
        else if (isConnected() && _owner.empty()) // and did not come meanwhile
            tell("logind is not there: " + describeError(reply));
    }

    void ownerChanged(sd_bus_message *signal) {
        const char *name = "", *before = "", *owner = "";
        if (senderOf(signal) != kBusName ||
            ::sd_bus_message_read(signal, "sss", &name, &before, &owner) <= 0 ||
            std::string_view(name) != kLogindName)
            return;
        logindIs(owner);
    }

    /// @param owner  The name on the bus that nobody else can have; empty: there is none.
    void logindIs(const char *owner) {
        if (_owner == owner)
            return;
        _owner = owner;
        _pending.reset();
        wake(); // only the one before would have told
        if (!_owner.empty())
            inhibit();
    }

    /// Not while calls that are under way fail because the bus is gone; `disconnected` comes after them.
    [[nodiscard]] bool isConnected() const noexcept { return ::sd_bus_is_open(_bus.get()) > 0; }

    void disconnected(sd_bus_message *) {
        tell("the system bus is gone");
        logindIs("");
        _inhibitor.reset();
        connectLater();
    }

    // --- The sleep -----------------------------------------------------------------------------------------

    void prepareForSleep(sd_bus_message *signal) {
        int isBeginning = 0;
        if (_owner.empty() || senderOf(signal) != _owner ||
            ::sd_bus_message_read(signal, "b", &isBeginning) <= 0)
            return;
        if (isBeginning)
            sleep();
        else if (wake(); !_inhibitor && !_pending)
            inhibit();
    }

    void sleep() {
        _isAsleep = true;
        if (_onSleep)
            _onSleep();
        _pending.reset();
        _inhibitor.reset();
    }

    void wake() {
        if (std::exchange(_isAsleep, false) && _onWake)
            _onWake();
    }

    /// Asks logind to wait. What it was asked before holds until it has answered.
    void inhibit() {
        sd_bus_slot *slot = nullptr;
        const int error = errorOf(callInhibit(slot));
        _pending.reset(slot);
        if (error)
            tell("logind cannot be asked: " + std::generic_category().message(error));
    }

    /// @param slot  Set to the call that is under way.
    /// @return An errno, negative, or not.
    int callInhibit(sd_bus_slot *&slot) noexcept {
        sd_bus_message *message = nullptr;
        int result = ::sd_bus_message_new_method_call(_bus.get(), &message, _owner.c_str(), kLogindPath,
                                                      kManager, "Inhibit");
        const Owned<sd_bus_message> owner(message);
        if (result >= 0)
            result = ::sd_bus_message_append(message, "ssss", "sleep", "zorvatouchd",
                                             "Release keys before sleep", "delay");
        if (result >= 0)
            result =
                ::sd_bus_call_async(_bus.get(), &slot, message, call<&Logind::inhibited>, this, kForEver);
        return result;
    }

    void inhibited(sd_bus_message *reply) {
        _pending.reset();
        UniqueFd inhibitor;
        if (!::sd_bus_message_is_method_error(reply, nullptr))
            inhibitor = descriptorOf(reply);
        if (inhibitor)
            _hasTold = false;
        else if (isConnected())
            tell("logind does not wait for us: " + describeError(reply));
        _inhibitor = std::move(inhibitor);
    }

    // --- The rest ------------------------------------------------------------------------------------------

    /// Says once what is amiss, until it is well again.
    void tell(const std::string &what) {
        if (!std::exchange(_hasTold, true))
            _log->write(Ports::LogLevel::Default,
                        what + "; keys that are down may stay down while the machine sleeps");
    }

    MainLoop &_loop;
    const std::shared_ptr<Ports::Log> _log;
    const Function _onSleep, _onWake;
    const LoopTimer _after;
    BackOff _backOff;
    LoopWatch _retry;    ///< until the bus is connected
    std::string _owner;  ///< logind's name on the bus; empty: it is not there
    UniqueFd _inhibitor; ///< logind waits as long as it is open
    bool _isAsleep = false;
    bool _hasTold = false;
    Owned<sd_bus> _bus;
    Owned<sd_bus_slot> _pending; ///< a call of Inhibit
};

SleepWatch::SleepWatch(MainLoop &loop, Ports::LogProvider &logs, Function onSleep, Function onWake,
                       LoopTimer after)
    : _logind(std::make_unique<Logind>(loop, logs.openLog(kLogSubsystem, "Sleep"), std::move(onSleep),
                                       std::move(onWake), std::move(after))) {
    _logind->connect();
}

SleepWatch::~SleepWatch() = default;

bool SleepWatch::isHoldingSleep() const noexcept { return _logind->isHoldingSleep(); }

} // namespace ZorvaTouch::Linux
