/* The interface between the library and a solver that it loads at run time.
 *
 * Plain C, so that another compiler may build a plugin.  A plugin exports one function, which returns a table that
 * lives as long as the process.  No function throws.  One thread at a time uses a problem; several threads may each use
 * one.
 */
#ifndef VTSYM_SOLVER_INTERFACE_H
#define VTSYM_SOLVER_INTERFACE_H

/* C and C++ share it.  NOLINTBEGIN(modernize-use-using,modernize-redundant-void-arg) */
#ifdef __cplusplus
extern "C" {
#endif

/* A problem that was read. */
struct vtsym_problem;

/* Receives the value of the unknown `index`: a decimal number with an optional minus. */
typedef void (*vtsym_value)(void* to, unsigned index, const char* decimal);

enum vtsym_verdict { VTSYM_UNKNOWN = 0, VTSYM_SATISFIABLE = 1, VTSYM_UNSATISFIABLE = 2 };

struct vtsym_problem_options {
    unsigned unknowns;  /* the constants u0 to u<unknowns - 1>, which the text does not declare */
    unsigned width;     /* 0: the unknowns are integers; otherwise bit vectors of that width, signed when reported */
    unsigned resources; /* that all checks of the problem may take together, in the solver's own deterministic unit */
    unsigned megabytes; /* of memory that the solver may take in this process; a check that needs more is unknown */
};

struct vtsym_solver_functions {
    /* Reads assertions in SMT-LIB 2.  A null pointer where they cannot be read or memory runs out. */
    struct vtsym_problem* (*open)(const char* assertions, const struct vtsym_problem_options* options);
    /* Decides the problem together with further assertions that hold for this check only.  Reports the values of all
     * unknowns through `value` when the verdict is VTSYM_SATISFIABLE. */
    enum vtsym_verdict (*check)(struct vtsym_problem* problem, const char* further, vtsym_value value, void* to);
    void (*close)(struct vtsym_problem* problem);
};

/* The one symbol that a plugin exports.  The number in its name is that of this interface. */
typedef const struct vtsym_solver_functions* (*vtsym_solver_entry)(void);
#define VTSYM_SOLVER_ENTRY "vtsym_solver_1"

#ifdef __cplusplus
}
#endif

/* NOLINTEND(modernize-use-using,modernize-redundant-void-arg) */

#endif
