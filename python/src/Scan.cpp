// Scanning C and C++ sources: the files below paths, and the findings of each file.
//
// A scanner has a mutex of its own; reading and scanning a file let other threads run.
#include "base/scan/SourceScan.hpp"
#include "python/src/Bindings.hpp"
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/io/Files.hpp"

#include <pybind11/stl.h>

#include <array>

namespace vtsym::python {

namespace {

/// In the order of VT::BranchFindingKind.
constexpr std::array<const char*, 4> kinds{"dead", "always-true", "removable", "spelled-out"};

class Scanner {
public:
    explicit Scanner(bool strictIncludes) : scanner_({.strictIncludes = strictIncludes}) {}

    py::list scanFile(const std::string& path) {
        return scan([&] { return readFile(path, mostBytes); }, isCppPath(path));
    }

    py::list scanText(const std::string& text, bool isCpp) {
        return scan([&] { return text; }, isCpp);
    }

    /// Branches, conditions that were not understood, and decisions that were given up.
    py::tuple counts() {
        const std::lock_guard lock(mutex_);
        const VT::SourceScanCounts& counts = scanner_.counts();
        return py::make_tuple(counts.branches, counts.unread, counts.undecided);
    }

private:
    template <class Read>
    py::list scan(Read read, bool isCpp) {
        std::vector<VT::BranchFinding> found;
        {
            const py::gil_scoped_release release;
            const std::lock_guard lock(mutex_);
            const std::string text = read();
            scanner_.scan(text, isCpp, [&](const VT::BranchFinding& finding) { found.push_back(finding); });
        }
        py::list findings;
        for (const VT::BranchFinding& finding : found)
            findings.append(tupleOf(finding));
        return findings;
    }

    static py::tuple tupleOf(const VT::BranchFinding& finding) {
        py::list reasons;
        for (const VT::BranchReason& reason : finding.reasons)
            reasons.append(py::make_tuple(reason.region.line, foreignText(reason.directive), reason.holds));
        return py::make_tuple(kinds.at(static_cast<std::size_t>(finding.kind)), finding.region.line,
                              finding.region.column, foreignText(finding.directive), foreignText(finding.condition),
                              foreignText(finding.proposed), reasons);
    }

    std::mutex mutex_;
    VT::SourceScanner scanner_;
};

/// The files in a stable order, and the paths that could not be searched, each with a sentence.
py::tuple filesBelow(const std::vector<std::string>& paths) {
    std::vector<std::string> files;
    std::vector<std::pair<std::string, std::string>> problems;
    {
        const py::gil_scoped_release release;
        files = sourceFiles(paths, [&](const std::string& path, const std::string& sentence) {
            problems.emplace_back(path, sentence);
        });
    }
    py::list names;
    for (const std::string& file : files)
        names.append(foreignText(file));
    py::list sentences;
    for (const auto& [path, sentence] : problems)
        sentences.append(py::make_tuple(foreignText(path), sentence));
    return py::make_tuple(names, sentences);
}

} // namespace

void addScan(py::module_& module) {
    py::class_<Scanner>(module, "Scanner")
        .def(py::init<bool>(), py::arg("strict_includes"))
        .def("scan_file", &Scanner::scanFile, py::arg("path"))
        .def("scan_text", &Scanner::scanText, py::arg("text"), py::arg("is_cpp"))
        .def("counts", &Scanner::counts);
    module.def("source_files", &filesBelow, py::arg("paths"));
}

} // namespace vtsym::python
