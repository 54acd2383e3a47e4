// The solver plugin over Z3: decides what the library's own procedures leave open.
//
// Each problem has a context of its own, so that its verdict does not depend on other problems and threads need no
// lock: about a millisecond. In it are two kept simple solvers, on which checks push and pop: 15 to 1,200 microseconds
// for most checks, where a default solver costs ten milliseconds. The first one may use Groebner bases, which prove
// more, and gets few resources, because they were seen to run for minutes without counting a step; so was arithmetic
// solver 6, and both use solver 2. The resource limit is Z3's own count of steps, so that a verdict is the same on
// every machine: a million take up to 140 milliseconds.
#include "base/decide/external/SolverInterface.h"

#include <z3.h>

#include <algorithm>
#include <array>
#include <cstring>
#include <exception>
#include <memory>
#include <string>
#include <vector>

/// Reads texts, checks and reports values.
struct vtsym_problem {
    explicit vtsym_problem(const vtsym_problem_options& options)
        : width_(options.width),
          left_(options.resources),
          context_(makeContext(), Z3_del_context),
          solvers_{makeSolver(), makeSolver()} {
        Z3_set_error_handler(context_.get(), [](Z3_context, Z3_error_code) {});
        setLimits();
        const Z3_sort sort = width_ == 0 ? Z3_mk_int_sort(context_.get()) : Z3_mk_bv_sort(context_.get(), width_);
        for (unsigned i = 0; i < options.unknowns; ++i) {
            names_.push_back(Z3_mk_string_symbol(context_.get(), ("u" + std::to_string(i)).c_str()));
            unknowns_.push_back(Z3_mk_func_decl(context_.get(), names_.back(), 0, nullptr, sort));
        }
    }

    vtsym_problem(const vtsym_problem&) = delete;
    vtsym_problem& operator=(const vtsym_problem&) = delete;

    ~vtsym_problem() {
        for (const Z3_solver solver : solvers_)
            Z3_solver_dec_ref(context_.get(), solver);
    }

    /// Asserts what a text says; false where it cannot be read.
    bool add(const char* text) {
        Z3_context c = context_.get();
        const Z3_ast_vector read = Z3_parse_smtlib2_string(
            c, text, 0, nullptr, nullptr, static_cast<unsigned>(names_.size()), names_.data(), unknowns_.data());
        if (Z3_get_error_code(c) != Z3_OK || read == nullptr)
            return false;
        Z3_ast_vector_inc_ref(c, read);
        for (unsigned i = 0; i < Z3_ast_vector_size(c, read); ++i)
            for (const Z3_solver solver : solvers_)
                Z3_solver_assert(c, solver, Z3_ast_vector_get(c, read, i));
        Z3_ast_vector_dec_ref(c, read);
        return Z3_get_error_code(c) == Z3_OK;
    }

    vtsym_verdict check(const char* further, vtsym_value value, void* to) {
        for (const Z3_solver solver : solvers_)
            Z3_solver_push(context_.get(), solver);
        vtsym_verdict verdict = VTSYM_UNKNOWN;
        if (add(further)) {
            for (const Z3_solver solver : solvers_) {
                if (left_ == 0)
                    break;
                setLimits();
                const Z3_lbool answer = Z3_solver_check(context_.get(), solver);
                countResources(solver);
                if (answer == Z3_L_FALSE)
                    verdict = VTSYM_UNSATISFIABLE;
                else if (answer == Z3_L_TRUE && reportValues(solver, value, to))
                    verdict = VTSYM_SATISFIABLE;
                if (answer != Z3_L_UNDEF)
                    break;
            }
        }
        for (const Z3_solver solver : solvers_)
            Z3_solver_pop(context_.get(), solver, 1);
        return verdict;
    }

private:
    struct Configuration {
        Z3_config made = Z3_mk_config();

        Configuration() = default;
        Configuration(const Configuration&) = delete;
        Configuration& operator=(const Configuration&) = delete;

        ~Configuration() { Z3_del_config(made); }
    };

    static Z3_context makeContext() {
        const Configuration configuration;
        return Z3_mk_context(configuration.made);
    }

    /// A solver is counted before the context makes another object.
    Z3_solver makeSolver() {
        const Z3_solver solver = Z3_mk_simple_solver(context_.get());
        Z3_solver_inc_ref(context_.get(), solver);
        return solver;
    }

    /// What is left for the next check.  An interrupt ends the program rather than the check.
    void setLimits() {
        Z3_context c = context_.get();
        for (const Z3_solver solver : solvers_) {
            const bool isQuick = solver == solvers_[0];
            const Z3_params parameters = Z3_mk_params(c);
            Z3_params_inc_ref(c, parameters);
            Z3_params_set_uint(c, parameters, Z3_mk_string_symbol(c, "rlimit"),
                               isQuick ? std::min(left_, quick) : left_);
            Z3_params_set_uint(c, parameters, Z3_mk_string_symbol(c, "arith.solver"), 2);
            Z3_params_set_bool(c, parameters, Z3_mk_string_symbol(c, "arith.nl.grobner"), isQuick);
            Z3_params_set_bool(c, parameters, Z3_mk_string_symbol(c, "ctrl_c"), false);
            Z3_solver_set_params(c, solver, parameters);
            Z3_params_dec_ref(c, parameters);
        }
    }

    /// Takes what the context has used since the last count.
    void countResources(Z3_solver solver) {
        Z3_context c = context_.get();
        const Z3_stats statistics = Z3_solver_get_statistics(c, solver);
        if (statistics == nullptr) {
            left_ = 0;
            return;
        }
        Z3_stats_inc_ref(c, statistics);
        unsigned count = 0;
        for (unsigned i = 0; i < Z3_stats_size(c, statistics); ++i)
            if (std::strcmp(Z3_stats_get_key(c, statistics, i), "rlimit count") == 0 &&
                Z3_stats_is_uint(c, statistics, i))
                count = Z3_stats_get_uint_value(c, statistics, i);
        Z3_stats_dec_ref(c, statistics);
        const unsigned used = count > counted_ ? count - counted_ : 1;
        counted_ = count;
        left_ = used < left_ ? left_ - used : 0;
    }

    bool reportValues(Z3_solver solver, vtsym_value value, void* to) {
        Z3_context c = context_.get();
        const Z3_model model = Z3_solver_get_model(c, solver);
        if (model == nullptr)
            return false;
        Z3_model_inc_ref(c, model);
        bool complete = true;
        for (unsigned i = 0; i < unknowns_.size() && complete; ++i) {
            Z3_ast number = nullptr;
            Z3_ast asked = Z3_mk_app(c, unknowns_[i], 0, nullptr);
            if (width_ != 0)
                asked = Z3_mk_bv2int(c, asked, true);
            complete = Z3_model_eval(c, model, asked, true, &number) && Z3_is_numeral_ast(c, number);
            if (complete)
                value(to, i, Z3_get_numeral_string(c, number));
        }
        Z3_model_dec_ref(c, model);
        return complete;
    }

    static constexpr unsigned quick = 3000; ///< resources of the first solver in a check: about 3 milliseconds

    unsigned width_;
    unsigned left_;
    unsigned counted_ = 0;
    std::unique_ptr<_Z3_context, void (*)(Z3_context)> context_;
    std::array<Z3_solver, 2> solvers_;
    std::vector<Z3_symbol> names_;
    std::vector<Z3_func_decl> unknowns_;
};

namespace {

vtsym_problem* openProblem(const char* assertions, const vtsym_problem_options* options) {
    try {
        Z3_global_param_set("memory_max_size", std::to_string(options->megabytes).c_str());
        auto problem = std::make_unique<vtsym_problem>(*options);
        if (problem->add(assertions))
            return problem.release();
    } catch (const std::exception&) { // out of memory
    }
    return nullptr;
}

vtsym_verdict checkProblem(vtsym_problem* problem, const char* further, vtsym_value value, void* to) {
    try {
        return problem->check(further, value, to);
    } catch (const std::exception&) {
        return VTSYM_UNKNOWN;
    }
}

void closeProblem(vtsym_problem* problem) {
    delete problem;
}

constexpr vtsym_solver_functions functions{openProblem, checkProblem, closeProblem};

} // namespace

extern "C" __attribute__((visibility("default"))) const vtsym_solver_functions* vtsym_solver_1();

extern "C" const vtsym_solver_functions* vtsym_solver_1() {
    return &functions;
}
