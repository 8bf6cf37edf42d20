/*
 * Holds the plug-in's file against the boundary's header, in C and with nothing else: what the factory makes,
 * what is in the tables, and what they answer without a device.
 *
 *     zorvatouch-plugin-tables PLUGIN
 *
 * Prints each thing that is not as it must be. Exit status 0 if there is none.
 */
#include <zorvatouch/ZorvaPlugIn.h>

#include <dlfcn.h>
#include <stdio.h>
#include <string.h>

static int failures;

#define EXPECT(condition) expect((condition) != 0, #condition, __LINE__)
static void expect(int holds, const char *condition, int line) {
    if (holds)
        return;
    fprintf(stderr, "PlugInTables.c:%d: does not hold: %s\n", line, condition);
    ++failures;
}

static const ZorvaUuid baseIdentifier = {{0, 0, 0, 0, 0, 0, 0, 0, 0xC0, 0, 0, 0, 0, 0, 0, 0x46}};

/* Whether the slots from first to last hold something. */
static int areFilled(const void *table, size_t first, size_t last) {
    for (size_t slot = first; slot <= last; ++slot) {
        void *content;
        memcpy(&content, (const char *)table + slot * sizeof content, sizeof content);
        if (!content)
            return 0;
    }
    return 1;
}

static void checkTables(PlugInInterfaceTable **plugIn, HidServiceInterfaceTable **hid) {
    EXPECT(sizeof **plugIn == 64);
    EXPECT(sizeof **hid == 104);
    EXPECT(areFilled(*plugIn, 0, 3));
    EXPECT((*plugIn)->version == 1);
    EXPECT((*plugIn)->revision == 0);
    EXPECT(areFilled(*plugIn, 5, 7));
    EXPECT(areFilled(*hid, 0, 12));
    EXPECT((*plugIn)->object == (*hid)->object);
}

static void checkIdentifiers(PlugInInterfaceTable **plugIn, HidServiceInterfaceTable **hid) {
    void *found = NULL;
    EXPECT((*hid)->QueryInterface(hid, kZorvaPlugInInterface, &found) == ZORVA_STATUS_SUCCESS);
    EXPECT(found == plugIn);
    EXPECT((*hid)->Release(hid) == 2);
    found = &failures;
    EXPECT((*plugIn)->QueryInterface(plugIn, baseIdentifier, &found) == ZORVA_STATUS_NO_INTERFACE);
    EXPECT((*plugIn)->QueryInterface(plugIn, kZorvaHidServicePlugInType, &found) ==
           ZORVA_STATUS_NO_INTERFACE);
    EXPECT((*plugIn)->QueryInterface(plugIn, kZorvaPlugInInterface, NULL) == ZORVA_STATUS_NO_INTERFACE);
    EXPECT(found == &failures);
}

static void checkVersion(HidServiceInterfaceTable **hid) {
    static const uint64_t numbers[] = {26, 0, 0};
    const ZorvaValue *version = (*hid)->copyProperty(hid, "Version");
    EXPECT(version);
    if (!version)
        return;
    EXPECT(version->table->kind(version) == kZorvaValueArray);
    EXPECT(version->table->count(version) == 3);
    for (size_t index = 0; index < 3; ++index) {
        const ZorvaValue *element = version->table->element(version, index);
        EXPECT(element && element->table->unsignedValue(element) == numbers[index]);
    }
    version->table->release(version);
}

static void checkStatus(HidServiceInterfaceTable **hid) {
    const ZorvaValue *status = (*hid)->copyProperty(hid, "ServiceStatus");
    EXPECT(status);
    if (!status)
        return;
    size_t length = 0;
    EXPECT(status->table->kind(status) == kZorvaValueDictionary);
    EXPECT(status->table->count(status) == 2);
    const char *key = status->table->key(status, 0, &length);
    EXPECT(length == 6 && memcmp(key, "Reason", 6) == 0);
    const ZorvaValue *reason = status->table->element(status, 0);
    const char *text = reason->table->stringValue(reason, &length);
    EXPECT(length == 11 && memcmp(text, "unscheduled", 11) == 0);
    key = status->table->key(status, 1, &length);
    EXPECT(length == 9 && memcmp(key, "Scheduled", 9) == 0);
    const ZorvaValue *scheduled = status->table->element(status, 1);
    EXPECT(scheduled->table->kind(scheduled) == kZorvaValueBoolean);
    EXPECT(scheduled->table->booleanValue(scheduled) == 0);
    status->table->release(status);
}

static void checkAnswersWithoutADevice(PlugInInterfaceTable **plugIn, HidServiceInterfaceTable **hid) {
    int32_t score = 4711;
    EXPECT((*plugIn)->Probe(plugIn, NULL, NULL, &score) == ZORVA_STATUS_SUCCESS);
    EXPECT(score == 4711);
    EXPECT((*plugIn)->Start(plugIn, NULL, NULL) == ZORVA_STATUS_NO_RESOURCES);
    EXPECT((*hid)->open(hid, 1) == 0);
    (*hid)->close(hid, 1);
    EXPECT((*hid)->copyProperty(hid, "Product") == NULL);
    EXPECT((*hid)->copyProperty(hid, NULL) == NULL);
    EXPECT((*hid)->setProperty(hid, "Product", NULL) == 0);
    (*hid)->setEventCallback(hid, NULL, NULL, NULL);
    (*hid)->unscheduleFromDispatchQueue(hid, NULL);
    EXPECT((*hid)->copyEvent(hid, kZorvaEventDigitizer, NULL, 0) == NULL);
    EXPECT((*hid)->setOutputEvent(hid, NULL) == ZORVA_STATUS_UNSUPPORTED);
    EXPECT((*plugIn)->Stop(plugIn) == ZORVA_STATUS_SUCCESS);
    EXPECT((*plugIn)->Stop(plugIn) == ZORVA_STATUS_SUCCESS);
}

static void checkService(PlugInInterfaceTable **plugIn) {
    HidServiceInterfaceTable **hid = NULL;
    EXPECT((*plugIn)->AddRef(plugIn) == 2);
    EXPECT((*plugIn)->Release(plugIn) == 1);
    EXPECT((*plugIn)->QueryInterface(plugIn, kZorvaHidServiceInterface, (void **)&hid) ==
           ZORVA_STATUS_SUCCESS);
    if (!hid)
        return;
    checkTables(plugIn, hid);
    checkIdentifiers(plugIn, hid);
    checkVersion(hid);
    checkStatus(hid);
    checkAnswersWithoutADevice(plugIn, hid);
    EXPECT((*hid)->Release(hid) == 1);
    EXPECT((*plugIn)->Release(plugIn) == 0);
}

int main(int argc, char **argv) {
    void *file = argc == 2 ? dlopen(argv[1], RTLD_NOW | RTLD_LOCAL) : NULL;
    if (!file) {
        fprintf(stderr, "zorvatouch-plugin-tables: %s\n", argc == 2 ? dlerror() : "PLUGIN");
        return 1;
    }
    ZorvaPlugInFactory factory;
    *(void **)&factory = dlsym(file, ZORVA_TOUCH_FACTORY_NAME);
    EXPECT(factory);
    if (factory) {
        EXPECT(factory(NULL, kZorvaPlugInInterface) == NULL);
        EXPECT(factory(NULL, baseIdentifier) == NULL);
        PlugInInterfaceTable **plugIn = factory(NULL, kZorvaHidServicePlugInType);
        EXPECT(plugIn);
        if (plugIn)
            checkService(plugIn);
    }
    dlclose(file);
    return failures != 0;
}
