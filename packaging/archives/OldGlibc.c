/* OldGlibc: what the C++ runtime, linked into a library, asks of a glibc newer than 2.17, made of what 2.17 has.
 *
 * The linker records the newest version of each function that the C library of the build machine offers, and an older
 * C library refuses the file then. A definition in the library itself comes first, for libstdc++ and libgcc inside it,
 * too; as all here are hidden, neither the program nor other libraries see them. tests/archives/symbols.py reads the
 * versions of what is built: a new name there is one that is missing here.
 */
#define _GNU_SOURCE
#include <dlfcn.h>
#include <link.h>
#include <pthread.h>
#include <stdarg.h>
#include <stdlib.h>
#include <string.h>
#include <sys/syscall.h>
#include <unistd.h>

#define HIDDEN __attribute__((visibility("hidden")))

/* The version of a machine's oldest functions, and the layout of `struct stat` that the compiler's headers mean. */
#if defined(__x86_64__)
#define FIRST_VERSION "GLIBC_2.2.5"
enum { statLayout = 1 };
#elif defined(__i386__)
#define FIRST_VERSION "GLIBC_2.0"
enum { statLayout = 3 };
#elif defined(__aarch64__)
#define FIRST_VERSION "GLIBC_2.17"
enum { statLayout = 0 };
#else
#error "The first version of this machine's C library has to be named here."
#endif

/* ---- Threads: in glibc 2.34, functions of libpthread moved to libc and got a second version. The first one is found
 * in libpthread.so.0 before and in libc since, and every system has the former, were it empty: the libraries are linked
 * with it. */
#define FIRST(name) __asm__(".symver first_" #name "," #name "@" FIRST_VERSION)
FIRST(pthread_once);
FIRST(pthread_key_create);
FIRST(pthread_key_delete);
FIRST(pthread_getspecific);
FIRST(pthread_setspecific);
extern int first_pthread_once(pthread_once_t* once, void (*run)(void));
extern int first_pthread_key_create(pthread_key_t* key, void (*end)(void*));
extern int first_pthread_key_delete(pthread_key_t key);
extern void* first_pthread_getspecific(pthread_key_t key);
extern int first_pthread_setspecific(pthread_key_t key, const void* value);

HIDDEN int pthread_once(pthread_once_t* once, void (*run)(void))
{
    return first_pthread_once(once, run);
}

/* libgcc takes its presence for that of threads. */
HIDDEN int __pthread_key_create(pthread_key_t* key, void (*end)(void*));
int __pthread_key_create(pthread_key_t* key, void (*end)(void*))
{
    return first_pthread_key_create(key, end);
}

/* Whether the process has one thread (2.32): counters in libstdc++ then need no atomic operations. Not known here. */
HIDDEN extern char __libc_single_threaded;
char __libc_single_threaded = 0;

/* ---- Destructors of thread_local objects (2.18) hang on a key of the thread. A thread that ends runs its own. The
 * thread that ends the process or unloads the library runs its own, too; those of other threads never run then, as
 * their code may be gone. */
struct Ending {
    void (*run)(void*);
    void* object;
    struct Ending* earlier;
};

static pthread_once_t endingsOnce = PTHREAD_ONCE_INIT;
static pthread_key_t endings;
static int haveEndings;

static void runEndings(void* last)
{
    struct Ending* ending = last;
    while (ending != NULL) {
        struct Ending* earlier = ending->earlier;
        ending->run(ending->object);
        free(ending);
        ending = earlier;
    }
}

static void closeEndings(void)
{
    void* last = first_pthread_getspecific(endings);
    first_pthread_key_delete(endings);
    haveEndings = 0;
    runEndings(last);
}

static void openEndings(void)
{
    haveEndings = first_pthread_key_create(&endings, runEndings) == 0;
    if (haveEndings && atexit(closeEndings) != 0) { /* in a library, unloading calls it as well */
        first_pthread_key_delete(endings);
        haveEndings = 0;
    }
}

HIDDEN int __cxa_thread_atexit_impl(void (*run)(void*), void* object, void* library);
int __cxa_thread_atexit_impl(void (*run)(void*), void* object, void* library)
{
    (void)library;
    first_pthread_once(&endingsOnce, openEndings);
    struct Ending* ending = haveEndings ? malloc(sizeof *ending) : NULL;
    if (ending == NULL) {
        return -1;
    }
    ending->run = run;
    ending->object = object;
    ending->earlier = first_pthread_getspecific(endings);
    const int status = first_pthread_setspecific(endings, ending);
    if (status != 0) {
        free(ending);
    }
    return status;
}

/* ---- Files: up to glibc 2.33, the functions of a file's status were inline calls of these, which take the layout. */
struct stat;
struct stat64;
#define STATUS(name, oldName, kind, What)             \
    extern int oldName(int, What, struct kind*);      \
    HIDDEN int name(What which, struct kind* status); \
    int name(What which, struct kind* status)         \
    {                                                 \
        return oldName(statLayout, which, status);    \
    }
STATUS(stat, __xstat, stat, const char*)
STATUS(stat64, __xstat64, stat64, const char*)
STATUS(lstat, __lxstat, stat, const char*)
STATUS(lstat64, __lxstat64, stat64, const char*)
STATUS(fstat, __fxstat, stat, int)
STATUS(fstat64, __fxstat64, stat64, int)

/* 2.28, where its locks are of 64 bits. An argument is an integer or a pointer: a machine word holds each. */
FIRST(fcntl);
extern int first_fcntl(int file, int command, ...);
HIDDEN int fcntl(int file, int command, ...);
int fcntl(int file, int command, ...)
{
    va_list arguments;
    va_start(arguments, command);
    void* argument = va_arg(arguments, void*);
    va_end(arguments);
    return first_fcntl(file, command, argument);
}

/* 2.27. It fails in Linux before 3.17, which does not have the call. */
HIDDEN int memfd_create(const char* name, unsigned flags);
int memfd_create(const char* name, unsigned flags)
{
    return (int)syscall(SYS_memfd_create, name, flags);
}

/* ---- Exceptions: where the object with a piece of code has its tables (2.35). libgcc of a build machine with an older
 * glibc looks for them itself, in this very way. */
#ifdef DLFO_STRUCT_HAS_EH_DBASE
struct Search {
    ElfW(Addr) code;
    struct dl_find_object* found;
};

static int searchObject(struct dl_phdr_info* info, size_t size, void* argument)
{
    (void)size;
    const struct Search* search = argument;
    int here = 0;
    ElfW(Addr) tables = 0;
    for (ElfW(Half) i = 0; i < info->dlpi_phnum; ++i) {
        const ElfW(Phdr)* part = &info->dlpi_phdr[i];
        const ElfW(Addr) start = info->dlpi_addr + part->p_vaddr;
        if (part->p_type == PT_LOAD && search->code - start < part->p_memsz) {
            here = 1;
        } else if (part->p_type == DLFO_EH_SEGMENT_TYPE) {
            tables = start;
        }
    }
    if (here) {
        search->found->dlfo_eh_frame = (void*)tables;
    }
    return here;
}

/* Fills in what the unwinder reads. The base of addresses relative to data remains NULL: position-independent code for
 * today's processors has none of those. */
HIDDEN int _dl_find_object(void* code, struct dl_find_object* found)
{
    struct Search search = {(ElfW(Addr))code, found};
    memset(found, 0, sizeof *found);
    return dl_iterate_phdr(searchObject, &search) != 0 && found->dlfo_eh_frame != NULL ? 0 : -1;
}
#endif
