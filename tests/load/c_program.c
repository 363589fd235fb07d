/* A manager in C: loads the provider, works with it, unloads it, and looks whether it has really
 * gone; many times. Nothing of C++ is linked, so nothing of it may stay behind.
 *
 *   c-program [--cycles N] [--manager KIND] [--provider FILE] [--desk FILE] [--flush FILE]
 *             [--scenario FILE]
 *
 * --flush is the module with the manager's own flush function, loaded before the provider as such a
 * manager has it. Exit status: 0 fine, 1 not. */
#include <cmpidt.h>
#include <cmpift.h>
#include <dirent.h>
#include <dlfcn.h>
#include <stdarg.h>
#include <stdio.h>
#include <stdlib.h>
#include <string.h>
#include <syslog.h>
#include <time.h>
#include <unistd.h>

#include "plexor_desk.h"

struct settings {
    int cycles;
    const char *manager, *provider, *desk, *flush, *scenario;
};

struct desk_functions {
    plexor_desk_open_fn* open;
    plexor_desk_close_fn* close;
    plexor_desk_broker_fn* broker;
    plexor_desk_begin_call_fn* begin_call;
    plexor_desk_context_fn* context;
    plexor_desk_end_call_fn* end_call;
    plexor_desk_enumerate_fn* enumerate;
    plexor_desk_get_fn* get;
    plexor_desk_cleanup_fn* cleanup;
    plexor_desk_command_fn* command;
    plexor_desk_totals_fn* totals;
    plexor_desk_defect_fn* defect;
};

static const char* const classes[] = {"Tovexa_PlexorController",    "Tovexa_PlexorSoftwareIdentity",
                                      "Tovexa_PlexorStorageVolume", "Tovexa_PlexorStorageExtent",
                                      "Tovexa_PlexorSASSATAPort",   "Tovexa_PlexorBattery"};

/* ---- A clock that waits for nobody, in front of the C library's. ---- */

static long skipped; /* seconds; atomic */

time_t time(time_t* out) {
    struct timespec real;
    clock_gettime(CLOCK_REALTIME, &real);
    const time_t now = real.tv_sec + __atomic_load_n(&skipped, __ATOMIC_RELAXED);
    if (out) *out = now;
    return now;
}

static void pause_briefly(void) {
    const struct timespec moment = {0, 500000};
    nanosleep(&moment, NULL);
}

unsigned int sleep(unsigned int seconds) {
    __atomic_add_fetch(&skipped, (long)seconds, __ATOMIC_RELAXED);
    pause_briefly();
    return 0;
}

/* ---- What is checked ---- */

__attribute__((format(printf, 1, 2), noreturn)) static void fail(const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    fputs("c-program: ", stderr);
    vfprintf(stderr, format, arguments);
    fputc('\n', stderr);
    va_end(arguments);
    exit(1);
}

static long resident_kib(void) {
    long pages = 0;
    FILE* file = fopen("/proc/self/statm", "r");
    if (!file || fscanf(file, "%*d %ld", &pages) != 1) fail("no memory figures");
    fclose(file);
    return pages * (sysconf(_SC_PAGESIZE) / 1024);
}

static int entries_of(const char* directory) {
    int count = 0;
    DIR* list = opendir(directory);
    if (!list) fail("cannot read %s", directory);
    for (const struct dirent* entry = readdir(list); entry; entry = readdir(list))
        if (entry->d_name[0] != '.') count++;
    closedir(list);
    return count;
}

static int threads(void) {
    return entries_of("/proc/self/task");
}

/* A thread that was joined may still be listed for a moment: the join returns before the kernel has
 * taken it off. The provider is unmapped by then, so one that still ran would end the program. */
static void wait_for_a_single_thread(int cycle) {
    for (int i = 0; i < 240000 && threads() != 1; i++) pause_briefly();
    if (threads() != 1) fail("cycle %d: %d threads are left", cycle + 1, threads());
}

/* Without the one that counts. */
static int descriptors(void) {
    return entries_of("/proc/self/fd") - 1;
}

static int is_mapped(const char* file) {
    const char* name = strrchr(file, '/') ? strrchr(file, '/') + 1 : file;
    char line[4096];
    int found = 0;
    FILE* maps = fopen("/proc/self/maps", "r");
    if (!maps) fail("cannot read the memory map");
    while (!found && fgets(line, sizeof line, maps)) found = strstr(line, name) != NULL;
    fclose(maps);
    return found;
}

static void check_unmapped(const char* what, const char* file) {
    void* left = dlopen(file, RTLD_NOW | RTLD_NOLOAD);
    if (left) fail("%s is still loaded after dlclose", what);
    if (is_mapped(file)) fail("%s is still mapped after dlclose", what);
}

/* ---- One cycle ---- */

static void* load(const char* file, int flags) {
    void* library = dlopen(file, RTLD_NOW | flags);
    if (!library) fail("%s", dlerror());
    return library;
}

static void bind_name(void* library, const char* name, void* function) {
    void* address = dlsym(library, name);
    if (!address) fail("no %s", name);
    memcpy(function, &address, sizeof address);
}

static struct desk_functions bind_desk(void* library) {
    struct desk_functions desk;
#define BIND(name) bind_name(library, "plexor_desk_" #name, &desk.name)
    BIND(open);
    BIND(close);
    BIND(broker);
    BIND(begin_call);
    BIND(context);
    BIND(end_call);
    BIND(enumerate);
    BIND(get);
    BIND(cleanup);
    BIND(command);
    BIND(totals);
    BIND(defect);
#undef BIND
    return desk;
}

static CMPIInstanceMI* call_factory(void* provider, const struct desk_functions* api,
                                    plexor_desk* desk) {
    CMPIInstanceMI* (*factory)(const CMPIBroker*, const CMPIContext*, CMPIStatus*);
    bind_name(provider, "PlexorProvider_Create_InstanceMI", &factory);
    CMPIStatus status = {CMPI_RC_OK, NULL};
    plexor_desk_call* call = api->begin_call(desk);
    CMPIInstanceMI* mi = factory(api->broker(desk), api->context(call), &status);
    api->end_call(call);
    if (!mi) fail("the factory gives nothing");
    return mi;
}

static void wait_for_inventory(void* provider) {
    unsigned int* done;
    bind_name(provider, "ThreadActivityDone", &done);
    for (int i = 0; i < 240000; i++) {
        if (__atomic_load_n(done, __ATOMIC_ACQUIRE)) return;
        pause_briefly();
    }
    fail("the inventory does not arrive");
}

static void request(const struct desk_functions* api, plexor_desk* desk, CMPIInstanceMI* mi) {
    for (size_t i = 0; i < sizeof classes / sizeof *classes; i++) {
        const long found = api->enumerate(desk, mi, classes[i]);
        if (found <= 0) fail("%s: %ld instances", classes[i], found);
        const int rc = api->get(desk, mi, classes[i], 0);
        if (rc != CMPI_RC_OK) fail("%s: get answers %d", classes[i], rc);
    }
}

static void check_books(const struct desk_functions* api, plexor_desk* desk) {
    const plexor_desk_books books = api->totals(desk);
    char text[512] = "";
    if (books.defects != 0) {
        api->defect(desk, 0, text, sizeof text);
        fail("defect: %s", text);
    }
    if (books.clones != 0) fail("%zu clones are left", books.clones);
}

/* Odd cycles unload after the idle time, even ones because the manager stops. */
static void run_cycle(const struct settings* settings, int cycle) {
    void* flush = settings->flush ? load(settings->flush, RTLD_GLOBAL) : NULL;
    void* provider = load(settings->provider, RTLD_LOCAL);
    void* module = load(settings->desk, RTLD_LOCAL);
    const struct desk_functions api = bind_desk(module);
    char error[512] = "";
    plexor_desk* desk = api.open(settings->scenario, settings->manager, error, sizeof error);
    if (!desk) fail("%s", error);

    CMPIInstanceMI* mi = call_factory(provider, &api, desk);
    wait_for_inventory(provider);
    request(&api, desk, mi);
    const int idle = cycle % 2;
    if (idle) sleep(301);
    const int rc = api.cleanup(desk, mi, !idle);
    if (rc != CMPI_RC_OK) fail("cleanup answers %d", rc);
    check_books(&api, desk);

    dlclose(provider);
    api.close(desk);
    dlclose(module);
    if (flush) dlclose(flush);
    check_unmapped("the provider", settings->provider);
    check_unmapped("the desk", settings->desk);
}

/* ---- All of them ---- */

static struct settings read_settings(int argc, char** argv) {
    struct settings settings = {10, "", PROVIDER, DESK, NULL, SCENARIO};
    for (int i = 1; i < argc; i += 2) {
        if (i + 1 == argc) fail("%s needs a value", argv[i]);
        const struct {
            const char* name;
            const char** value;
        } options[] = {{"--manager", &settings.manager},
                       {"--provider", &settings.provider},
                       {"--desk", &settings.desk},
                       {"--flush", &settings.flush},
                       {"--scenario", &settings.scenario}};
        int known = strcmp(argv[i], "--cycles") == 0;
        if (known) settings.cycles = atoi(argv[i + 1]);
        for (size_t j = 0; j < sizeof options / sizeof *options; j++) {
            if (strcmp(argv[i], options[j].name) != 0) continue;
            *options[j].value = argv[i + 1];
            known = 1;
        }
        if (!known) fail("unknown option %s", argv[i]);
    }
    return settings;
}

int main(int argc, char** argv) {
    const struct settings settings = read_settings(argc, argv);
    const long most_growth_kib = 1024;
    const int warm_up = settings.cycles > 200 ? 100 : settings.cycles / 2;
    setlogmask(LOG_UPTO(LOG_EMERG));
    long settled = resident_kib();
    int files = 0;
    for (int cycle = 0; cycle < settings.cycles; cycle++) {
        run_cycle(&settings, cycle);
        if (cycle == warm_up) settled = resident_kib();
        if (cycle == 0) files = descriptors();
        wait_for_a_single_thread(cycle);
        if (descriptors() != files) fail("cycle %d: a descriptor is left", cycle + 1);
    }
    const long growth = resident_kib() - settled;
    printf("%d cycles, unmapped each time, resident %+ld KiB, threads %d, descriptors %d\n",
           settings.cycles, growth, threads(), descriptors());
    if (growth > most_growth_kib) fail("memory grows");
    return 0;
}
