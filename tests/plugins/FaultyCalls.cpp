// Preloaded into the program: from main() on, one call of a kind fails, or all from one on.
//
//   VTSYM_FAULT="write 3 once"   the third write fails          VTSYM_FAULT="memory 7 on"   no allocation succeeds from
//   the 7th on VTSYM_FAULT_COUNTS=FILE      how many calls of each kind there were, in the order of `kinds`
#include <array>
#include <atomic>
#include <cerrno>
#include <cstdarg>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <dirent.h>
#include <dlfcn.h>
#include <fcntl.h>
#include <string_view>
#include <sys/syscall.h>
#include <unistd.h>

extern "C" {
void* __libc_malloc(std::size_t bytes);
void* __libc_calloc(std::size_t count, std::size_t bytes);
void* __libc_realloc(void* place, std::size_t bytes);
void* __libc_memalign(std::size_t alignment, std::size_t bytes);
}

namespace {

enum Kind : std::uint8_t { Open, Read, Write, Close, Rename, Memory };

struct KindOfCall {
    std::string_view name;
    int error;
};

constexpr std::array<KindOfCall, 6> kinds{
    {{"open", EMFILE}, {"read", EIO}, {"write", ENOSPC}, {"close", EIO}, {"rename", EIO}, {"memory", ENOMEM}}};

std::array<std::atomic<unsigned long>, kinds.size()> made{};
bool isArmed = false;
std::size_t failingKind = kinds.size();
unsigned long failingNumber = 0;
bool failsFromThenOn = false;

/// Counts a call; whether it has to fail.
bool fails(Kind kind) noexcept {
    if (!isArmed)
        return false;
    const unsigned long number = ++made[kind];
    if (kind != failingKind || (failsFromThenOn ? number < failingNumber : number != failingNumber))
        return false;
    errno = kinds[kind].error;
    return true;
}

template <class Function>
Function* next(const char* name) {
    return reinterpret_cast<Function*>(dlsym(RTLD_NEXT, name));
}

void readRequest() {
    const char* const request = std::getenv("VTSYM_FAULT");
    char kind[16] = {};
    char how[8] = {};
    if (request == nullptr || std::sscanf(request, "%15s %lu %7s", kind, &failingNumber, how) != 3)
        return;
    for (std::size_t i = 0; i < kinds.size(); ++i)
        if (kinds[i].name == kind)
            failingKind = i;
    failsFromThenOn = std::string_view(how) == "on";
}

using Main = int (*)(int, char**, char**);
Main programMain = nullptr;

int armedMain(int argc, char** argv, char** environment) {
    readRequest();
    isArmed = true;
    return programMain(argc, argv, environment);
}

struct Report {
    ~Report() {
        isArmed = false;
        const char* const path = std::getenv("VTSYM_FAULT_COUNTS");
        if (path == nullptr)
            return;
        if (std::FILE* const file = std::fopen(path, "w")) {
            for (const std::atomic<unsigned long>& count : made)
                std::fprintf(file, "%lu\n", count.load());
            std::fclose(file);
        }
    }
} report;

int openAt(int folder, const char* path, int flags, mode_t mode) noexcept {
    return fails(Open) ? -1 : static_cast<int>(syscall(SYS_openat, folder, path, flags, mode));
}

mode_t modeOf(int flags, std::va_list arguments) {
    return (flags & (O_CREAT | O_TMPFILE)) != 0 ? va_arg(arguments, mode_t) : 0;
}

} // namespace

extern "C" {

int __libc_start_main(Main main, int argc, char** argv, void (*init)(), void (*fini)(), void (*rtld)(), void* stack) {
    programMain = main;
    using Start = int(Main, int, char**, void (*)(), void (*)(), void (*)(), void*);
    return next<Start>("__libc_start_main")(armedMain, argc, argv, init, fini, rtld, stack);
}

#define VTSYM_OPEN(name, folder, parameters)                                                                           \
    int name parameters {                                                                                              \
        std::va_list arguments;                                                                                        \
        va_start(arguments, flags);                                                                                    \
        const int descriptor = openAt(folder, path, flags, modeOf(flags, arguments));                                  \
        va_end(arguments);                                                                                             \
        return descriptor;                                                                                             \
    }
VTSYM_OPEN(open, AT_FDCWD, (const char* path, int flags, ...))
VTSYM_OPEN(open64, AT_FDCWD, (const char* path, int flags, ...))
VTSYM_OPEN(openat, folder, (int folder, const char* path, int flags, ...))
VTSYM_OPEN(openat64, folder, (int folder, const char* path, int flags, ...))
#undef VTSYM_OPEN

DIR* opendir(const char* path) {
    return fails(Open) ? nullptr : next<DIR*(const char*)>("opendir")(path);
}

DIR* fdopendir(int descriptor) {
    return fails(Open) ? nullptr : next<DIR*(int)>("fdopendir")(descriptor);
}

std::FILE* fopen(const char* path, const char* mode) {
    return fails(Open) ? nullptr : next<std::FILE*(const char*, const char*)>("fopen")(path, mode);
}

std::FILE* fopen64(const char* path, const char* mode) {
    return fails(Open) ? nullptr : next<std::FILE*(const char*, const char*)>("fopen64")(path, mode);
}

ssize_t read(int descriptor, void* to, size_t bytes) {
    return fails(Read) ? -1 : syscall(SYS_read, descriptor, to, bytes);
}

ssize_t write(int descriptor, const void* from, size_t bytes) {
    return fails(Write) ? -1 : syscall(SYS_write, descriptor, from, bytes);
}

int close(int descriptor) {
    const bool isFailing = fails(Close);
    const int status = static_cast<int>(syscall(SYS_close, descriptor)); // the descriptor is gone either way
    if (isFailing)
        errno = kinds[Close].error;
    return isFailing ? -1 : status;
}

int rename(const char* from, const char* to) noexcept {
    return fails(Rename) ? -1 : static_cast<int>(syscall(SYS_rename, from, to));
}

void* malloc(size_t bytes) noexcept {
    return fails(Memory) ? nullptr : __libc_malloc(bytes);
}

void* calloc(size_t count, size_t bytes) noexcept {
    return fails(Memory) ? nullptr : __libc_calloc(count, bytes);
}

void* realloc(void* place, size_t bytes) noexcept {
    return fails(Memory) ? nullptr : __libc_realloc(place, bytes);
}

void* aligned_alloc(size_t alignment, size_t bytes) noexcept {
    return fails(Memory) ? nullptr : __libc_memalign(alignment, bytes);
}
}
