/* A host of the library for simulators that is written in C, has no C++ runtime, and loads and unloads the library
 * while it runs. Inside, an exception is thrown and caught in every thread, whose own objects end with it. host LIBRARY
 */
#include <dlfcn.h>
#include <pthread.h>
#include <stdio.h>
#include <string.h>

enum { rounds = 3, threads = 4 };

/* The library's functions; ISO C has no conversion from what dlsym returns. */
static void (*putInput)(int);
static int (*computeUnit)(int, int);
static const char* (*unitMessage)(void);

static int find(void* library, const char* name, void* function)
{
    void* const found = dlsym(library, name);
    memcpy(function, &found, sizeof found);
    return found != NULL;
}

static void* refusedUnit(void* wrong)
{
    putInput(1);
    if (computeUnit(99, 0) != 0 || strcmp(unitMessage(), "ERROR:unit:unit 99 is not allowed, expected 0 to 8") != 0) {
        *(int*)wrong = 1;
    }
    return NULL;
}

static int useInThreads(void)
{
    int wrong[threads + 1] = {0};
    pthread_t running[threads];
    for (int i = 0; i < threads; ++i) {
        if (pthread_create(&running[i], NULL, refusedUnit, &wrong[i]) != 0) {
            return 1;
        }
    }
    refusedUnit(&wrong[threads]);
    int all = wrong[threads];
    for (int i = 0; i < threads; ++i) {
        pthread_join(running[i], NULL);
        all |= wrong[i];
    }
    return all;
}

int main(int count, char** arguments)
{
    for (int round = 0; round < rounds; ++round) {
        void* library = count == 2 ? dlopen(arguments[1], RTLD_NOW | RTLD_LOCAL) : NULL;
        if (library == NULL || !find(library, "morvik_dpi_unit_put", &putInput) ||
            !find(library, "morvik_dpi_unit_compute", &computeUnit) ||
            !find(library, "morvik_dpi_unit_message", &unitMessage)) {
            fprintf(stderr, "%s\n", count == 2 ? dlerror() : "host LIBRARY");
            return 1;
        }
        if (useInThreads() != 0) {
            fprintf(stderr, "A unit is not refused as it should be\n");
            return 1;
        }
        dlclose(library);
        if (dlopen(arguments[1], RTLD_NOW | RTLD_NOLOAD) != NULL) {
            fprintf(stderr, "The library is still loaded\n");
            return 1;
        }
    }
    puts("loaded, used and unloaded");
    return 0;
}
