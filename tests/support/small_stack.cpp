#include "tests/support/small_stack.h"

#ifdef _WIN32
#include <windows.h>
#else
#include <pthread.h>
#endif

namespace pextest {

namespace {

#ifdef _WIN32
DWORD WINAPI Run(void* work) {
    (*static_cast<const std::function<void()>*>(work))();
    return 0;
}
#else
void* Run(void* work) {
    (*static_cast<const std::function<void()>*>(work))();
    return nullptr;
}
#endif

}  // namespace

bool RunOnStack(std::size_t stackBytes, const std::function<void()>& work) {
    void* argument = const_cast<std::function<void()>*>(&work);
#ifdef _WIN32
    // The size is the reservation, as the linker's stack size is for the main thread.
    HANDLE thread = ::CreateThread(nullptr, stackBytes, Run, argument, STACK_SIZE_PARAM_IS_A_RESERVATION, nullptr);
    if (thread == nullptr) return false;
    ::WaitForSingleObject(thread, INFINITE);
    ::CloseHandle(thread);
    return true;
#else
    pthread_attr_t attributes;
    pthread_attr_init(&attributes);
    pthread_t thread;
    const bool started = pthread_attr_setstacksize(&attributes, stackBytes) == 0 &&
                         pthread_create(&thread, &attributes, Run, argument) == 0;
    pthread_attr_destroy(&attributes);
    if (started) pthread_join(thread, nullptr);
    return started;
#endif
}

}  // namespace pextest
