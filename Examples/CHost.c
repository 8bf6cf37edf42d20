/*
 * A host in plain C: loads the plug-in, offers it a device made of the functions below, feeds it the reports
 * of a recording, and prints the gestures that come back.
 *
 *     CHost PLUGIN RECORDING
 *
 * It needs nothing but the boundary's header and the plug-in's file; ReportReader.h is for the recording. Its
 * objects live as long as the process, so retain and release have nothing to do. A real host differs in what
 * the device reads.
 */
#define _POSIX_C_SOURCE 200809L /* getdelim */
#include "ReportReader.h"
#include <zorvatouch/ZorvaPlugIn.h>

#include <dlfcn.h>
#include <pthread.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
/* The functions of a table take what they are given, needed or not. */
#pragma GCC diagnostic ignored "-Wunused-parameter"
#define LIVES_ON(Type)                                                                                       \
    static void retain##Type(Type *object) {}                                                                \
    static void release##Type(Type *object) {}
LIVES_ON(ZorvaQueue)
LIVES_ON(ZorvaDevice)
LIVES_ON(ZorvaService)

/* ---- A serial queue that the main thread works off ------------------------------------------------ */
typedef struct Job {
    ZorvaFunction run;
    void *context;
    struct Job *next;
} Job;
static pthread_mutex_t lock = PTHREAD_MUTEX_INITIALIZER;
static pthread_cond_t changed = PTHREAD_COND_INITIALIZER;
static Job *firstJob, **lastJob = &firstJob;
static int devicePlayed;

/* Nothing is left over to be discarded: main runs everything. */
static ZorvaBoolean submit(ZorvaQueue *queue, ZorvaFunction run, ZorvaFunction discard, void *context) {
    Job *job = malloc(sizeof *job);
    if (!job)
        return 0;
    *job = (Job){run, context, NULL};
    pthread_mutex_lock(&lock);
    *lastJob = job;
    lastJob = &job->next;
    pthread_cond_signal(&changed);
    pthread_mutex_unlock(&lock);
    return 1;
}

/* Waits for a job and runs it. Returns 0 when there is none and the device has played to its end. */
static int runNextJob(void) {
    pthread_mutex_lock(&lock);
    while (!firstJob && !devicePlayed)
        pthread_cond_wait(&changed, &lock);
    Job *job = firstJob;
    if (job && !(firstJob = job->next))
        lastJob = &firstJob;
    pthread_mutex_unlock(&lock);
    if (job)
        job->run(job->context);
    free(job);
    return job != NULL;
}

static const ZorvaQueueTable queueTable = {sizeof queueTable, retainZorvaQueue, releaseZorvaQueue, submit};
static ZorvaQueue queue = {&queueTable};

/* ---- A device that plays the reports of a recording ------------------------------------------------ */
static ReportReader recording;
static uint8_t *buffer; /* the service's */
static size_t bufferSize;
static ZorvaInputReportCallback reportCallback;
static void *reportContext;
static ZorvaRunLoop *deviceLoop;
static uint64_t deviceSource;
static ZorvaStatus openOrClose(ZorvaDevice *device, uint32_t options) { return ZORVA_STATUS_SUCCESS; }
static void registerCallback(ZorvaDevice *device, uint8_t *reports, size_t size,
                             ZorvaInputReportCallback callback, void *context) {
    buffer = reports, bufferSize = size, reportCallback = callback, reportContext = context;
}

/* The source is ready: one report, on the input thread. A device that has no more goes away and says so. */
static void deliverReport(void *device) {
    size_t length;
    if (readReport(&recording, buffer, bufferSize, &length)) {
        const uint32_t id = length > 0 ? buffer[0] : 0;
        reportCallback(reportContext, ZORVA_STATUS_SUCCESS, device, 0, id, buffer, length, 0);
        deviceLoop->table->signalSource(deviceLoop, deviceSource);
        return;
    }
    deviceLoop->table->removeSource(deviceLoop, deviceSource);
    pthread_mutex_lock(&lock);
    devicePlayed = 1;
    pthread_cond_signal(&changed);
    pthread_mutex_unlock(&lock);
}
static void scheduleDevice(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) {
    loop->table->retain(loop);
    deviceLoop = loop;
    deviceSource = loop->table->addSource(loop, mode, deliverReport, device);
    loop->table->signalSource(loop, deviceSource);
}
static void unscheduleDevice(ZorvaDevice *device, ZorvaRunLoop *loop, const char *mode) {
    loop->table->removeSource(loop, deviceSource);
    loop->table->release(loop);
}
static ZorvaStatus getFeatureReport(ZorvaDevice *device, uint32_t id, uint8_t *report, size_t *length) {
    return ZORVA_STATUS_UNSUPPORTED;
}
static const ZorvaValue *copyProperty(ZorvaDevice *device, const char *key) { return NULL; }
static ZorvaBoolean setProperty(ZorvaDevice *device, const char *key, const ZorvaValue *value) { return 0; }
static const ZorvaDeviceTable deviceTable = {
    sizeof deviceTable, retainZorvaDevice, releaseZorvaDevice, openOrClose,  openOrClose, registerCallback,
    scheduleDevice,     unscheduleDevice,  getFeatureReport,   copyProperty, setProperty};
static ZorvaDevice device = {&deviceTable};

static ZorvaDevice *createDevice(ZorvaService *service) { return &device; }
static const ZorvaServiceTable serviceTable = {sizeof serviceTable,         retainZorvaService,
                                               releaseZorvaService,         createDevice,
                                               NULL /* no accelerometer */, NULL};
static ZorvaService service = {&serviceTable};

/* ---- The host -------------------------------------------------------------------------------------- */
static int fail(const char *what, const char *why) {
    fprintf(stderr, "CHost: %s: %s\n", what, why);
    return 1;
}

static void printEvent(void *stream, void *refcon, void *sender, const ZorvaEvent *event, uint32_t options) {
    static const char *const regions[] = {"nowhere", "play/pause", "volume down", "volume up"};
    const uint32_t phase = event->table->phase(event);
    int64_t mask = 0;
    double region = 0;
    event->table->integerField(event, kZorvaFieldDigitizerMask, &mask);
    event->table->floatField(event, kZorvaFieldDigitizerY, &region);
    const char *gesture = mask == ZORVA_EVENT_MASK_TAP ? "tap"
                          : phase == kZorvaPhaseBegan  ? "hold begins"
                          : phase == kZorvaPhaseEnded  ? "hold ends"
                                                       : "hold moves";
    if (mask != 0) /* else a finger that may begin something, or that was withdrawn */
        fprintf(stream, "%-12s%s\n", gesture, regions[(unsigned)region % 4]);
}

/* Schedule has no result; a property has the reason if it failed. Like every value and event, it is released
 * before the plug-in's file is unloaded. */
static int isScheduled(HidServiceInterfaceTable **hid) {
    const ZorvaValue *status = (*hid)->copyProperty(hid, "ServiceStatus");
    int failures = 0;
    for (size_t index = 0, length; status && index < status->table->count(status); ++index) {
        const char *key = status->table->key(status, index, &length);
        if (length != strlen("Reason") || memcmp(key, "Reason", length) != 0)
            continue;
        const ZorvaValue *reason = status->table->element(status, index);
        const char *text = reason->table->stringValue(reason, &length);
        failures += fprintf(stderr, "CHost: not scheduled: %.*s\n", (int)length, text);
    }
    if (status)
        status->table->release(status);
    return failures == 0;
}

/* The life of a service: queried, started, opened, scheduled; then all of it back. */
static int runService(PlugInInterfaceTable **plugIn) {
    HidServiceInterfaceTable **hid = NULL;
    if ((*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, (void **)&hid) != ZORVA_STATUS_SUCCESS)
        return fail("the plug-in", "has no HID service interface");
    if ((*plugIn)->Start(plugIn, NULL, &service) != ZORVA_STATUS_SUCCESS || !(*hid)->open(hid, 0))
        return fail("the service", "cannot open the device");
    (*hid)->setEventCallback(hid, printEvent, stdout, NULL);
    (*hid)->scheduleWithDispatchQueue(hid, &queue);
    const int status = isScheduled(hid) ? 0 : 1;
    while (status == 0 && runNextJob()) { /* until the device is done, and nothing is on its way any more */
    }
    (*hid)->unscheduleFromDispatchQueue(hid, &queue);
    (*hid)->close(hid, 0);
    (*plugIn)->Stop(plugIn);
    (*hid)->Release(hid);
    return status;
}

int main(int argc, char **argv) {
    char *text = NULL;
    size_t size = 0;
    FILE *file = argc == 3 ? fopen(argv[2], "r") : NULL;
    if (!file || getdelim(&text, &size, 0, file) < 0)
        return fail(argc == 3 ? argv[2] : "usage", argc == 3 ? "cannot be read" : "CHost PLUGIN RECORDING");
    fclose(file);
    if (!openReports(&recording, text))
        return fail(argv[2], "is not a recording of a known version");
    void *plugInFile = dlopen(argv[1], RTLD_NOW | RTLD_LOCAL);
    if (!plugInFile)
        return fail("the plug-in", dlerror());
    ZorvaPlugInFactory factory;
    *(void **)&factory = dlsym(plugInFile, ZORVA_TOUCH_FACTORY_NAME);
    PlugInInterfaceTable **plugIn = factory ? factory(NULL, kZorvaHidServicePlugInType) : NULL;
    if (!plugIn)
        return fail(argv[1], "makes no HID service");
    const int status = runService(plugIn);
    if ((*plugIn)->Release(plugIn) == 0) /* and every value and event is released: its code may go */
        dlclose(plugInFile);
    free(text);
    return status;
}
