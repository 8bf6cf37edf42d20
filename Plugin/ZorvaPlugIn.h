/*
 * The boundary between a host and its HID service plug-ins, in plain C (C11, C17, C++17, C++20).
 *
 * A host loads a plug-in's file, looks up its factory by name and drives the service through two tables of
 * functions. Everything else that crosses the boundary is an object: a structure that begins with a pointer
 * to a table of functions, the object itself being the first argument of each. Either side makes such objects
 * as it likes (usually as the first member of a larger structure) and reads the other's through their tables;
 * neither needs the other's library for that.
 *
 * Conventions of all tables
 *
 *   References   An object lives as long as there is a reference to it. Arguments are borrowed for the call:
 *                to keep one longer, retain it. What a function called copy or create returns is a reference
 *                that the caller releases. Pointers to text and bytes are borrowed and last as long as the
 *                object that returned them.
 *   Results      Where a function stores something through a pointer, that pointer is not null unless it says
 *                so.
 *   Text         UTF-8. With a length where one is given, ended by NUL where none is.
 *   Tables       `size` is sizeof the table as its maker knew it: newer tables have more entries at the end.
 *                No entry may be null unless it says that it is optional. A table that ends before
 *                optional entries is accepted, as if they were null. Tables outlive their objects.
 *   Booleans     One byte, 0 or 1.
 *   Exceptions   Never cross the boundary in either direction.
 *   Threads      [host]   the thread on which the host drives the service; it makes one call at a time
 *                [input]  the thread that the service starts when it is scheduled, one for each scheduling
 *                [queue]  whatever runs the host's serial queue
 *                [any]    any thread, several at a time
 */
#ifndef ZORVA_PLUGIN_H
#define ZORVA_PLUGIN_H

#include <stddef.h>
#include <stdint.h>

/* NOLINTBEGIN(modernize-use-using): this is C */
#ifdef __cplusplus
extern "C" {
#endif

/* ---- Plain types ---------------------------------------------------------------------------------- */

typedef uint32_t ZorvaStatus;
#define ZORVA_STATUS_SUCCESS 0x00000000u
#define ZORVA_STATUS_NO_RESOURCES 0xE00002BEu
#define ZORVA_STATUS_UNSUPPORTED 0xE00002C7u
#define ZORVA_STATUS_NO_INTERFACE 0x80000004u

typedef uint8_t ZorvaBoolean;

/* A 128-bit identifier, its bytes in the order in which it is written. Passed by value. */
typedef struct ZorvaUuid {
    uint8_t bytes[16];
} ZorvaUuid;

/* 0516B563-B15B-11DA-96EB-0014519758EF: what a factory is asked for, a HID service plug-in. */
static const ZorvaUuid kZorvaHidServicePlugInType = {
    {0x05, 0x16, 0xB5, 0x63, 0xB1, 0x5B, 0x11, 0xDA, 0x96, 0xEB, 0x00, 0x14, 0x51, 0x97, 0x58, 0xEF}};
/* C244E858-109C-11D4-91D4-0050E4C6426F: PlugInInterfaceTable. */
static const ZorvaUuid kZorvaPlugInInterface = {
    {0xC2, 0x44, 0xE8, 0x58, 0x10, 0x9C, 0x11, 0xD4, 0x91, 0xD4, 0x00, 0x50, 0xE4, 0xC6, 0x42, 0x6F}};
/* 6FE22ABF-68B9-11DB-A71F-0016CBC110F7: HidServiceInterfaceTable. */
static const ZorvaUuid kZorvaHidServiceInterface = {
    {0x6F, 0xE2, 0x2A, 0xBF, 0x68, 0xB9, 0x11, 0xDB, 0xA7, 0x1F, 0x00, 0x16, 0xCB, 0xC1, 0x10, 0xF7}};

/* ---- Values --------------------------------------------------------------------------------------- */

enum {
    kZorvaValueNull = 0,
    kZorvaValueBoolean = 1,
    kZorvaValueUnsigned = 2, /* 64 bits */
    kZorvaValueDouble = 3,
    kZorvaValueString = 4,
    kZorvaValueBytes = 5,
    kZorvaValueArray = 6,
    kZorvaValueDictionary = 7 /* from string to value */
};

/* Limits of every value. Levels: a value without parts has one. Parts: the value itself, elements and entries
 * at every level, missing ones included. A property whose value has more is refused as a whole: a write
 * returns 0 and a read null, with one line in the log. */
#define ZORVA_VALUE_MAX_LEVELS 64u
#define ZORVA_VALUE_MAX_PARTS 1000000u

/* A dynamically typed value. Immutable: it may be read on several threads. Wherever a value is passed,
 * returned or contained, a null pointer means the same as a value of kind null. [any] */
typedef struct ZorvaValue ZorvaValue;
typedef struct ZorvaValueTable {
    size_t size;
    void (*retain)(const ZorvaValue *value);
    void (*release)(const ZorvaValue *value);
    /* One of kZorvaValue...; the other functions answer for their own kind, and 0 or null for any other. */
    uint32_t (*kind)(const ZorvaValue *value);
    ZorvaBoolean (*booleanValue)(const ZorvaValue *value);
    uint64_t (*unsignedValue)(const ZorvaValue *value);
    double (*doubleValue)(const ZorvaValue *value);
    /* Stores the length in bytes; never null for a string. */
    const char *(*stringValue)(const ZorvaValue *value, size_t *length);
    /* Stores the length; may be null when it is 0. */
    const uint8_t *(*bytesValue)(const ZorvaValue *value, size_t *length);
    /* Elements of an array, entries of a dictionary. */
    size_t (*count)(const ZorvaValue *value);
    /* The element, or the entry's value, below `count`; else null. Borrowed. A null pointer below `count` is
     * an element of kind null. */
    const ZorvaValue *(*element)(const ZorvaValue *value, size_t index);
    /* The entry's key, below `count`; else null. Stores the length in bytes. An entry below `count` without a
     * key is left out. */
    const char *(*key)(const ZorvaValue *value, size_t index, size_t *length);
} ZorvaValueTable;
struct ZorvaValue {
    const ZorvaValueTable *table;
};

/* ---- Events --------------------------------------------------------------------------------------- */

enum { kZorvaEventVendorDefined = 1, kZorvaEventDigitizer = 11, kZorvaEventAccelerometer = 13 };

/* Where in its life a gesture is; 0 when unset. */
enum {
    kZorvaPhaseBegan = 1,
    kZorvaPhaseChanged = 2,
    kZorvaPhaseEnded = 4,
    kZorvaPhaseCancelled = 8,
    kZorvaPhaseMayBegin = 128
};

/* What a digitizer event is about; may-begin and cancel have neither. */
#define ZORVA_EVENT_MASK_HOLD 0x00000002u
#define ZORVA_EVENT_MASK_TAP 0x00020000u

/* The region of a digitizer event, in its field y. */
enum {
    kZorvaRegionNone = 0,
    kZorvaRegionPlayPause = 1,
    kZorvaRegionVolumeDown = 2,
    kZorvaRegionVolumeUp = 3
};

/* Fields: the event's type in the upper half, a number in the lower. */
enum {
    kZorvaFieldVendorUsagePage = 0x10000,         /* integer */
    kZorvaFieldVendorUsage = 0x10001,             /* integer */
    kZorvaFieldVendorVersion = 0x10002,           /* integer */
    kZorvaFieldDigitizerX = 0xB0000,              /* float, always 0 */
    kZorvaFieldDigitizerY = 0xB0001,              /* float: the region, kZorvaRegion... */
    kZorvaFieldDigitizerZ = 0xB0002,              /* float, always 0 */
    kZorvaFieldDigitizerTransducer = 0xB0003,     /* integer: the transducer's type */
    kZorvaFieldDigitizerIndex = 0xB0004,          /* integer: its index */
    kZorvaFieldDigitizerIdentity = 0xB0005,       /* integer */
    kZorvaFieldDigitizerButtons = 0xB0006,        /* integer: a mask */
    kZorvaFieldDigitizerMask = 0xB0007,           /* integer: ZORVA_EVENT_MASK_... */
    kZorvaFieldDigitizerRange = 0xB0008,          /* integer: 0 or 1 */
    kZorvaFieldDigitizerTouch = 0xB0009,          /* integer: 0 or 1 */
    kZorvaFieldDigitizerPressure = 0xB000A,       /* float */
    kZorvaFieldDigitizerBarrelPressure = 0xB000B, /* float */
    kZorvaFieldDigitizerFrame = 0xB001B,          /* integer: number of the image that made the event */
    kZorvaFieldAccelerometerX = 0xD0000,          /* float, g */
    kZorvaFieldAccelerometerY = 0xD0001,          /* float, g */
    kZorvaFieldAccelerometerZ = 0xD0002           /* float, g */
};

/* An event. Immutable. [any] */
typedef struct ZorvaEvent ZorvaEvent;
typedef struct ZorvaEventTable {
    size_t size;
    void (*retain)(const ZorvaEvent *event);
    void (*release)(const ZorvaEvent *event);
    uint32_t (*type)(const ZorvaEvent *event);
    uint32_t (*phase)(const ZorvaEvent *event);
    uint64_t (*timestamp)(const ZorvaEvent *event); /* host ticks: nanoseconds of the monotonic clock */
    uint32_t (*options)(const ZorvaEvent *event);
    /* Stores a field and returns 1; 0, and nothing stored, if the event has no such integer or float field.
     */
    ZorvaBoolean (*integerField)(const ZorvaEvent *event, uint32_t field, int64_t *value);
    ZorvaBoolean (*floatField)(const ZorvaEvent *event, uint32_t field, double *value);
    /* The payload of a vendor-defined event; null, and 0 stored, for any other. */
    const uint8_t *(*payload)(const ZorvaEvent *event, size_t *length);
} ZorvaEventTable;
struct ZorvaEvent {
    const ZorvaEventTable *table;
};

/* ---- What the service asks of its host ------------------------------------------------------------ */

/* A function handed over to be run later: exactly one of `run` and `discard` is called, once. */
typedef void (*ZorvaFunction)(void *context);

/* A serial queue: runs what is submitted in order, one at a time, on threads of its own. [any] */
typedef struct ZorvaQueue ZorvaQueue;
typedef struct ZorvaQueueTable {
    size_t size;
    void (*retain)(ZorvaQueue *queue);
    void (*release)(ZorvaQueue *queue);
    /* Returns at once, before or after `run` has begun elsewhere; it must not run it itself, as the input
     * thread waits. 0: refused, neither function will be called. A queue that ends with work left discards
     * it. Neither function is null.
     *
     * The service calls this under its own lock, and perhaps retain and release. Its properties need that
     * lock too: a queue that reads or writes a property in here deadlocks. [input] */
    ZorvaBoolean (*submit)(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard, void *context);
} ZorvaQueueTable;
struct ZorvaQueue {
    const ZorvaQueueTable *table;
};

/* The input thread's run loop, made by the service, for devices and event clients to be scheduled on. It
 * serves the sources of one named mode at a time. */
typedef struct ZorvaRunLoop ZorvaRunLoop;
typedef struct ZorvaRunLoopTable {
    size_t size;
    void (*retain)(ZorvaRunLoop *loop);  /* [any] */
    void (*release)(ZorvaRunLoop *loop); /* [any] */
    /* Adds a source to a mode: `perform` is called on the loop's thread once for each time, or several
     * times, that the source has been signalled. Returns its number; 0 when there is no memory, or the mode
     * or the function is null. [any] */
    uint64_t (*addSource)(ZorvaRunLoop *loop, const char *mode, ZorvaFunction perform, void *context);
    /* The same for a descriptor: `perform` is called while it is readable, has failed or was hung up. The
     * descriptor stays its owner's; remove the source before closing it. 0 also for one that is not open or
     * cannot be polled: a regular file, a folder. [any] */
    uint64_t (*addDescriptor)(ZorvaRunLoop *loop, const char *mode, int descriptor, ZorvaFunction perform,
                              void *context);
    /* Makes a source ready. An unknown number is ignored. Does not block, takes no memory. [any] */
    void (*signalSource)(ZorvaRunLoop *loop, uint64_t source);
    /* Takes a source away; a loop whose mode has none left finishes. An unknown number is ignored.
     *
     * When its context may be freed: on the loop's own thread, after this; `perform` is not called again. On
     * another thread one call that has begun may still be going on. There, remove the source, and then hand
     * over to the entry `perform` below, in the same mode, a function that frees the context, as `run` and as
     * `discard`: either comes after that call. If it returns 0, keep the context. [any] */
    void (*removeSource)(ZorvaRunLoop *loop, uint64_t source);
    /* Has `run` called on the loop's thread in that mode, between two sources. `discard` may be null: there
     * is nothing to free. 0: no memory, or the mode or `run` is null; neither function will be called. What
     * is left when the loop is gone is discarded. [any] */
    ZorvaBoolean (*perform)(ZorvaRunLoop *loop, const char *mode, ZorvaFunction run, ZorvaFunction discard,
                            void *context);
} ZorvaRunLoopTable;
struct ZorvaRunLoop {
    const ZorvaRunLoopTable *table;
};

/* Receives an input report. [input]
 *
 * `result` and `sender` are not read. `type` and the whole `reportId` are only logged. `report` has `length`
 * bytes, report ID first, borrowed for the call; it may be null when the length is 0. `timestamp` is the
 * device's own, in host ticks, and only logged. */
typedef void (*ZorvaInputReportCallback)(void *context, ZorvaStatus result, void *sender, uint32_t type,
                                         uint32_t reportId, const uint8_t *report, size_t length,
                                         uint64_t timestamp);

/* An opened or unopened HID device. */
typedef struct ZorvaDevice ZorvaDevice;
typedef struct ZorvaDeviceTable {
    size_t size;
    void (*retain)(ZorvaDevice *device);  /* [any] */
    void (*release)(ZorvaDevice *device); /* [any] */
    /* Options are passed on as the host gave them. [host] */
    ZorvaStatus (*open)(ZorvaDevice *device, uint32_t options);
    ZorvaStatus (*close)(ZorvaDevice *device, uint32_t options);
    /* Sets the buffer into which reports are read and the function that gets them; a null function, with the
     * same buffer, takes both back. The device may use either only between the two calls. Called before the
     * device is scheduled and after it is unscheduled. [input] */
    void (*registerInputReportCallback)(ZorvaDevice *device, uint8_t *buffer, size_t bufferSize,
                                        ZorvaInputReportCallback callback, void *context);
    /* Adds the device's source to the loop in that mode, and removes it; the device keeps the loop retained
     * in between. A device that disappears removes its source itself. [input] */
    void (*schedule)(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode);
    void (*unschedule)(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode);
    /* Reads a feature report, report ID first, into `buffer`; `length` is the buffer's on the way in and the
     * report's on the way out. [any] */
    ZorvaStatus (*getFeatureReport)(ZorvaDevice *device, uint32_t reportId, uint8_t *buffer, size_t *length);
    /* A property of the device, or null if it has none of that name. [any] */
    const ZorvaValue *(*copyProperty)(ZorvaDevice *device, const char *key);
    /* Returns whether the device took it. `value` may be null. [any] */
    ZorvaBoolean (*setProperty)(ZorvaDevice *device, const char *key, const ZorvaValue *value);
} ZorvaDeviceTable;
struct ZorvaDevice {
    const ZorvaDeviceTable *table;
};

typedef struct ZorvaService ZorvaService;
typedef struct ZorvaEventClient ZorvaEventClient;

/* Receives an event of an event client. `event` is borrowed for the call. [input] */
typedef void (*ZorvaEventClientCallback)(void *context, const ZorvaEvent *event);

/* A connection to the host's event system: finds services and receives their events. [input] */
typedef struct ZorvaEventClientTable {
    size_t size;
    void (*retain)(ZorvaEventClient *client);  /* [any] */
    void (*release)(ZorvaEventClient *client); /* [any] */
    /* Narrows the client to the services that have these properties: a dictionary. */
    void (*setMatching)(ZorvaEventClient *client, const ZorvaValue *properties);
    /* Stores up to `capacity` references to matching services and returns how many match. */
    size_t (*copyServices)(ZorvaEventClient *client, ZorvaService **services, size_t capacity);
    /* Adds a callback for the events of matching services, and takes it away. */
    void (*registerCallback)(ZorvaEventClient *client, ZorvaEventClientCallback callback, void *context);
    void (*unregisterCallback)(ZorvaEventClient *client, ZorvaEventClientCallback callback, void *context);
    /* As the device's. */
    void (*schedule)(ZorvaEventClient *client, ZorvaRunLoop *loop, const char *mode);
    void (*unschedule)(ZorvaEventClient *client, ZorvaRunLoop *loop, const char *mode);
} ZorvaEventClientTable;
struct ZorvaEventClient {
    const ZorvaEventClientTable *table;
};

/* The kind of event client that monitors: it receives events and changes nothing. */
#define ZORVA_EVENT_CLIENT_MONITOR 1u

/* What the host offers: the place where a device, or an accelerometer, is attached. */
typedef struct ZorvaServiceTable {
    size_t size;
    void (*retain)(ZorvaService *service);  /* [any] */
    void (*release)(ZorvaService *service); /* [any] */
    /* The device of this service, or null. [host] */
    ZorvaDevice *(*createDevice)(ZorvaService *service);
    /* A client of the host's event system, ZORVA_EVENT_CLIENT_..., or null. The entry is optional: without it
     * the host has no event system. [input] */
    ZorvaEventClient *(*createEventClient)(ZorvaService *service, uint32_t type);
    /* Returns whether the service took it; `value` may be null. The entry is optional: without it the service
     * takes none. [any] */
    ZorvaBoolean (*setProperty)(ZorvaService *service, const char *key, const ZorvaValue *value);
} ZorvaServiceTable;
struct ZorvaService {
    const ZorvaServiceTable *table;
};

/* ---- The plug-in ---------------------------------------------------------------------------------- */

/* Receives the service's events, in order and one at a time. `sender` is the service's interface pointer of
 * kZorvaHidServiceInterface, without a reference; `event` is borrowed for the call; `options` is 0. It may
 * call the service back. [queue] */
typedef void (*ZorvaEventCallback)(void *target, void *refcon, void *sender, const ZorvaEvent *event,
                                   uint32_t options);

/* The tables of a service. An interface pointer points to a field that holds the table's address, so a call
 * is
 *
 *     (*interface)->AddRef(interface)
 *
 * Interface pointers are valid while the caller holds a reference to the service. */
typedef struct PlugInInterfaceTable {
    void *object; /* the service object; not the host's */
    /* Stores the interface pointer of `identifier` with a new reference. An unknown identifier, the
     * convention's base identifier among them, and a null `outInterface` give ZORVA_STATUS_NO_INTERFACE, and
     * nothing is stored. [any] */
    ZorvaStatus (*QueryInterface)(void *self, ZorvaUuid identifier, void **outInterface);
    /* One reference more, and less. The result is the count after it, for information. When the last one
     * goes, on whichever thread, the service goes; 0 means that nothing of it is left, anywhere. [any] */
    uint32_t (*AddRef)(void *self);
    uint32_t (*Release)(void *self);
    uint16_t version;  /* 1 */
    uint16_t revision; /* 0 */
    /* Whether the service fits; it always does. `outScore`, which may be null, is left as it is. [host] */
    ZorvaStatus (*Probe)(void *self, const ZorvaValue *properties, ZorvaService *service, int32_t *outScore);
    /* Creates the device; the service keeps it and `service` until Stop. ZORVA_STATUS_NO_RESOURCES: `service`
     * has no device. A second start releases the first device. [host] */
    ZorvaStatus (*Start)(void *self, const ZorvaValue *properties, ZorvaService *service);
    /* Releases the device. Unschedule and close it before. Always succeeds. [host] */
    ZorvaStatus (*Stop)(void *self);
} PlugInInterfaceTable;

typedef struct HidServiceInterfaceTable {
    void *object;
    ZorvaStatus (*QueryInterface)(void *self, ZorvaUuid identifier, void **outInterface);
    uint32_t (*AddRef)(void *self);
    uint32_t (*Release)(void *self);
    /* Opens the device with these options. 1: done; 0: it failed, or was not created. After Start. [host] */
    ZorvaBoolean (*open)(void *self, uint32_t options);
    /* Closes it. After unschedule. [host] */
    void (*close)(void *self, uint32_t options);
    /* A property, or null if it has no value or cannot be read. Not during Start and Stop. [any] */
    const ZorvaValue *(*copyProperty)(void *self, const char *key);
    /* Writes a property; the result is whether it was taken. `value` may be null. Likewise. [any] */
    ZorvaBoolean (*setProperty)(void *self, const char *key, const ZorvaValue *value);
    /* Sets the function that receives the events from the next schedule on. `target` and `refcon` are passed
     * to it and not read. [host] */
    void (*setEventCallback)(void *self, ZorvaEventCallback callback, void *target, void *refcon);
    /* Starts the input thread, and returns when the thread has its run loop; the device is scheduled on that
     * loop, and its first report read, at some time after. The property "ServiceStatus" says whether the
     * thread could be made, and why not. The queue is retained until it is unscheduled and everything
     * submitted is delivered. A second schedule unschedules first. [host] */
    void (*scheduleWithDispatchQueue)(void *self, ZorvaQueue *queue);
    /* Ends the input thread, and returns when it is gone: no report is handled any more. Events submitted
     * before are still delivered. `queue` is not compared. Harmless when nothing is scheduled. [host] */
    void (*unscheduleFromDispatchQueue)(void *self, ZorvaQueue *queue);
    /* Always null. [host] */
    const ZorvaEvent *(*copyEvent)(void *self, uint32_t type, const ZorvaEvent *matching, uint32_t options);
    /* Always ZORVA_STATUS_UNSUPPORTED. [host] */
    ZorvaStatus (*setOutputEvent)(void *self, const ZorvaEvent *event);
} HidServiceInterfaceTable;

/* Makes a service. `allocator` is not used and may be null. Returns the interface pointer of
 * kZorvaPlugInInterface with one reference, or null if `type` is not kZorvaHidServicePlugInType or there is
 * no memory. [any]
 *
 * The file may be unloaded when the last Release has returned 0, the queue has nothing left to run, and the
 * host has released everything else that came from the plug-in: values, events and run loops. Their functions
 * are in the file, so that a release after the unload crashes. */
typedef void *(*ZorvaPlugInFactory)(void *allocator, ZorvaUuid type);

/* The factory's name in the file of this plug-in. */
#define ZORVA_TOUCH_FACTORY_NAME "ZorvaTouchHIDServiceFactory"

#ifdef __cplusplus
} /* extern "C" */
#define ZORVA_PLUGIN_ASSERT(condition) static_assert(condition, #condition)
#else
#define ZORVA_PLUGIN_ASSERT(condition) _Static_assert(condition, #condition)
#endif

/* The layout that hosts and plug-ins were compiled against, where pointers have 64 bits. */
#if UINTPTR_MAX == UINT64_MAX
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaUuid) == 16);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaValueTable) == 96);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, kind) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, booleanValue) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, unsignedValue) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, doubleValue) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, stringValue) == 56);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, bytesValue) == 64);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, count) == 72);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, element) == 80);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaValueTable, key) == 88);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaEventTable) == 80);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, type) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, phase) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, timestamp) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, options) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, integerField) == 56);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, floatField) == 64);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventTable, payload) == 72);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaQueueTable) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaQueueTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaQueueTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaQueueTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaQueueTable, submit) == 24);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaRunLoopTable) == 64);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, addSource) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, addDescriptor) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, signalSource) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, removeSource) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaRunLoopTable, perform) == 56);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaDeviceTable) == 88);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, open) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, close) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, registerInputReportCallback) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, schedule) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, unschedule) == 56);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, getFeatureReport) == 64);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, copyProperty) == 72);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaDeviceTable, setProperty) == 80);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaEventClientTable) == 72);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, setMatching) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, copyServices) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, registerCallback) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, unregisterCallback) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, schedule) == 56);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaEventClientTable, unschedule) == 64);
ZORVA_PLUGIN_ASSERT(sizeof(ZorvaServiceTable) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaServiceTable, size) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaServiceTable, retain) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaServiceTable, release) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaServiceTable, createDevice) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaServiceTable, createEventClient) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(ZorvaServiceTable, setProperty) == 40);
ZORVA_PLUGIN_ASSERT(sizeof(PlugInInterfaceTable) == 64);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, object) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, QueryInterface) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, AddRef) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, Release) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, version) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, revision) == 34);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, Probe) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, Start) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(PlugInInterfaceTable, Stop) == 56);
ZORVA_PLUGIN_ASSERT(sizeof(HidServiceInterfaceTable) == 104);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, object) == 0);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, QueryInterface) == 8);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, AddRef) == 16);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, Release) == 24);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, open) == 32);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, close) == 40);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, copyProperty) == 48);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, setProperty) == 56);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, setEventCallback) == 64);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, scheduleWithDispatchQueue) == 72);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, unscheduleFromDispatchQueue) == 80);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, copyEvent) == 88);
ZORVA_PLUGIN_ASSERT(offsetof(HidServiceInterfaceTable, setOutputEvent) == 96);
#endif
#undef ZORVA_PLUGIN_ASSERT
/* NOLINTEND(modernize-use-using) */

#endif /* ZORVA_PLUGIN_H */
