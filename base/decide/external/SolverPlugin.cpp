// Loads a plugin with dlopen().
//
// A file beside the library that cannot be used is a fault; so is one that the system finds but cannot link. Whether
// the system finds one at all is read from the message of the dynamic linker, which begins with the missing file.
#include "base/decide/external/SolverPlugin.hpp"

#include "base/decide/external/SolverInterface.h"

#include <dlfcn.h>
#include <string_view>
#include <unistd.h>

namespace VT {

namespace {

constexpr std::string_view pluginFile = "libvtsym-z3.so";

/// The file that an address of code or data comes from; empty where that is not known.
std::string fileOf(const void* address) {
    Dl_info here{};
    return dladdr(address, &here) == 0 || here.dli_fname == nullptr ? "" : here.dli_fname;
}

/// This library, or the program that it is linked into.
std::string ownFile() {
    return fileOf(reinterpret_cast<const void*>(&SolverPlugin::installed));
}

/// Where the plugin is looked for first.
std::string fileBeside() {
    const std::string own = ownFile();
    return own.empty() ? "" : own.substr(0, own.rfind('/') + 1) + "vtsym/" + std::string(pluginFile);
}

} // namespace

SolverPlugin::SolverPlugin(std::string path) : path_(std::move(path)) {}

SolverPlugin& SolverPlugin::installed() {
    static SolverPlugin plugin;
    return plugin;
}

const vtsym_solver_functions* SolverPlugin::functions() {
    std::call_once(looked_, [this] { load(); });
    return functions_;
}

const std::string& SolverPlugin::fault() {
    functions();
    return fault_;
}

std::vector<std::string> SolverPlugin::files() {
    std::vector<std::string> all{ownFile()};
    if (!path_.empty())
        all.push_back(path_);
    else if (const std::string beside = fileBeside(); access(beside.c_str(), F_OK) == 0)
        all.push_back(beside);
    else if (functions() != nullptr)
        all.push_back(fileOf(functions()));
    return all;
}

void SolverPlugin::load() {
    if (!path_.empty()) {
        loadFrom(path_);
        return;
    }
    if (!loadFrom(fileBeside()))
        loadFrom(std::string(pluginFile));
}

/// Whether there is a plugin, usable or not.
bool SolverPlugin::loadFrom(const std::string& path) {
    const bool isFile = path.find('/') != std::string::npos;
    if (isFile && access(path.c_str(), F_OK) != 0)
        return false;
    void* const library = dlopen(path.c_str(), RTLD_NOW | RTLD_LOCAL);
    if (library == nullptr) {
        const char* const message = dlerror();
        const std::string_view reason = message != nullptr ? message : "it cannot be loaded";
        if (!isFile && reason.starts_with(path + ": cannot open shared object file"))
            return false;
        fault_ = "the solver plugin " + path + " cannot be used: ";
        fault_ += reason;
        return true;
    }
    void* const entry = dlsym(library, VTSYM_SOLVER_ENTRY);
    const vtsym_solver_functions* const functions =
        entry != nullptr ? reinterpret_cast<vtsym_solver_entry>(entry)() : nullptr;
    if (functions == nullptr || functions->open == nullptr || functions->check == nullptr ||
        functions->close == nullptr) {
        dlclose(library);
        fault_ = "the solver plugin " + path + " cannot be used: it is of another version of vtsym";
        return true;
    }
    functions_ = functions;
    return true;
}

} // namespace VT
