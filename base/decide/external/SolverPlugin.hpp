// A solver in a library of its own, loaded when the first question needs it.
//
// The core library links no solver, so that starting and every question that needs no solver cost nothing.
#pragma once

#include "host/Export.hpp"

#include <mutex>
#include <string>
#include <vector>

struct vtsym_solver_functions;

namespace VT {

class VTSYM_API SolverPlugin {
public:
    /// Looks for the plugin in one place.
    explicit SolverPlugin(std::string path);

    SolverPlugin(const SolverPlugin&) = delete;
    SolverPlugin& operator=(const SolverPlugin&) = delete;
    ~SolverPlugin() = default;

    /// The plugin of the process: libvtsym-z3.so in the folder `vtsym` beside this library, or else where the system
    /// looks for libraries.
    static SolverPlugin& installed();

    /// The solver, or nullptr where there is none.  The first call looks for it and loads it, and what it finds is
    /// remembered; it stays loaded until the process ends.  May be called by several threads.
    const vtsym_solver_functions* functions();

    /// Why a plugin that is there cannot be used; empty where it can, and where there is none.
    const std::string& fault();

    /// The files that answers depend on: this library, or the program that holds it, and the plugin.  Loads a plugin
    /// that only the system can find.
    std::vector<std::string> files();

private:
    SolverPlugin() = default;

    void load();
    bool loadFrom(const std::string& path);

    std::string path_; ///< empty: where an installed one is
    std::once_flag looked_;
    const vtsym_solver_functions* functions_ = nullptr;
    std::string fault_;
};

} // namespace VT
