/* A complete host program for Mendler.dll, in C: loads the library at run time, finds its export
 * UpdateAll, passes a progress callback, prints the progress and the result.
 *
 *   host_example [LIBRARY]
 *
 * LIBRARY is the path of Mendler.dll; by default "Mendler.dll", which Windows finds beside the
 * program, and "./Mendler.dll" on Linux. On Linux the library works on the emulated machine named
 * by $PEX_MACHINE (else ~/.local/share/pex/machine); on Windows on the machine itself.
 *
 * The interface, as the library exports it:
 *   - UpdateAll is a plain C function (no name decoration):
 *         bool UpdateAll(ProgressCallback callback);
 *     in the platform's default C calling convention (cdecl: on Windows x64 the one x64
 *     convention, on Linux the System V AMD64 one). bool is one byte, C's _Bool and C++'s bool.
 *     It applies the updates of every registered product and always returns false; the outcome of
 *     each product is in its content file and in the trace log (log\pex_support_mendler.log
 *     beside the library). callback may be NULL.
 *   - The callback gets the library's one progress record, the layout below, 292 bytes. Each
 *     value has a flag that is set with it and never cleared. CurrentStep counts every step of
 *     the process and is never reset: TotalSteps is first the number of products (CurrentStep
 *     moving once per product), then each product's own number of steps, counted from where that
 *     product started. The callback's result is ignored.
 *   - All work runs on the caller's thread; one call of UpdateAll at a time.
 *
 * Build: cc host_example.c -o host_example -ldl (Linux), or
 *        x86_64-w64-mingw32-gcc host_example.c -o host_example.exe (Windows).
 */
#include <stdbool.h>
#include <stddef.h>
#include <stdint.h>
#include <stdio.h>
#include <string.h>

#ifdef _WIN32
#include <windows.h>
#define MENDLER_CALL __cdecl
#else
#include <dlfcn.h>
#define MENDLER_CALL
#endif

typedef struct CProgressData {
    char StatusText[256]; /* NUL-terminated, at most 255 characters */
    bool StatusTextSet;
    int32_t TotalSteps;
    bool TotalStepsSet;
    int32_t CurrentStep;
    bool CurrentStepSet;
    int32_t ItemTotal; /* the file being expanded: its size ... */
    bool ItemTotalSet;
    int32_t ItemDone; /* ... and how much of it is done */
    bool ItemDoneSet;
} CProgressData;

_Static_assert(offsetof(CProgressData, TotalSteps) == 260, "layout of the progress record");
_Static_assert(offsetof(CProgressData, ItemDoneSet) == 288, "layout of the progress record");
_Static_assert(sizeof(CProgressData) == 292, "layout of the progress record");

typedef bool(MENDLER_CALL* ProgressCallback)(CProgressData* progress);
typedef bool(MENDLER_CALL* UpdateAllFunction)(ProgressCallback callback);

/* Where the run stands: UpdateAll first sets TotalSteps to the number of products, then each
 * product starts with the status "Analyzing data..." and, once its analysis is over, TotalSteps
 * holds its own number of steps, counted from the CurrentStep at which it started. */
static int32_t g_products, g_product, g_firstStep;
static bool g_inProduct;
static char g_lastLine[400];

static bool MENDLER_CALL ShowProgress(CProgressData* progress) {
    const char* status = progress->StatusTextSet ? progress->StatusText : "";
    if (!g_inProduct && strcmp(status, "Analyzing data...") == 0) {
        g_inProduct = true;
        g_product++;
        g_firstStep = progress->CurrentStep;
    }
    char line[sizeof g_lastLine];
    if (g_product == 0) {
        g_products = progress->TotalSteps;
        snprintf(line, sizeof line, "%d product(s) registered", (int)g_products);
    } else if (strncmp(status, "Analyzing", 9) == 0) {
        snprintf(line, sizeof line, "product %d of %d: %s", (int)g_product, (int)g_products, status);
    } else {
        int32_t total = progress->TotalSteps, step = progress->CurrentStep - g_firstStep;
        if (step > total) step = total;
        snprintf(line, sizeof line, "product %d of %d, step %d of %d: %s", (int)g_product,
                 (int)g_products, (int)step, (int)total, status);
    }
    if (strcmp(line, g_lastLine) != 0) {
        printf("%s\n", line);
        fflush(stdout);
        snprintf(g_lastLine, sizeof g_lastLine, "%s", line);
    }
    if (strcmp(status, "Finished.") == 0) g_inProduct = false;
    return true;
}

#ifdef _WIN32
static void* OpenLibrary(const char* path) { return (void*)LoadLibraryA(path); }
static void* FindExport(void* module, const char* name) {
    return (void*)GetProcAddress((HMODULE)module, name);
}
static void CloseLibrary(void* module) { FreeLibrary((HMODULE)module); }
static const char* LibraryError(void) {
    static char text[32];
    snprintf(text, sizeof text, "error %lu", (unsigned long)GetLastError());
    return text;
}
#define DEFAULT_LIBRARY "Mendler.dll"
#else
static void* OpenLibrary(const char* path) { return dlopen(path, RTLD_NOW | RTLD_LOCAL); }
static void* FindExport(void* module, const char* name) { return dlsym(module, name); }
static void CloseLibrary(void* module) { dlclose(module); }
static const char* LibraryError(void) { return dlerror(); }
#define DEFAULT_LIBRARY "./Mendler.dll"
#endif

int main(int argc, char** argv) {
    const char* path = argc > 1 ? argv[1] : DEFAULT_LIBRARY;
    void* module = OpenLibrary(path);
    if (!module) {
        fprintf(stderr, "host_example: cannot load %s: %s\n", path, LibraryError());
        return 1;
    }
    /* A function pointer from a data pointer: what POSIX and Windows both allow. */
    UpdateAllFunction updateAll;
    void* found = FindExport(module, "UpdateAll");
    memcpy(&updateAll, &found, sizeof updateAll);
    if (!found) {
        fprintf(stderr, "host_example: %s does not export UpdateAll\n", path);
        CloseLibrary(module);
        return 1;
    }
    bool result = updateAll(ShowProgress);
    printf("UpdateAll returned %s\n", result ? "true" : "false");
    CloseLibrary(module); /* closes the trace log */
    return 0;
}
