// Models of blocks with choices: reading them, and checking them as the program does.
//
// A check uses the service of the process, which nothing else in the module uses, so that checks come one after
// another.
#include "host/embedded/ModelFile.hpp"
#include "python/src/Bindings.hpp"
#include "tools/vtsym/findings/ModelCheck.hpp"

#include <pybind11/stl.h>

namespace vtsym::python {

namespace {

/// Keeps what a check finds.
class Collector : public FindingListener {
public:
    struct Problem {
        Place place;
        std::string sentence;
    };

    void write(const Finding& finding) override { findings.push_back(finding); }

    void problem(const Place& place, const std::string& sentence) override { problems.push_back({place, sentence}); }

    void note(const std::string& sentence) override { notes.push_back(sentence); }

    void remark(const Place&, std::span<const std::string> sentences, const std::string&) override {
        notes.insert(notes.end(), sentences.begin(), sentences.end());
    }

    std::vector<Finding> findings;
    std::vector<Problem> problems;
    std::vector<std::string> notes;
};

std::shared_ptr<VTRootBD> read(const std::string& json) {
    const py::gil_scoped_release release;
    auto model = std::make_shared<VTRootBD>();
    VT::Embedded::readModel(json, *model);
    return model;
}

/// Path, condition, line, and whether a block is a choice of the block around it; blocks follow those around them.
py::list blocksOf(const VTRootBD& model) {
    py::list blocks;
    for (const VTBlock& block : model.blocks())
        blocks.append(py::make_tuple(block.path(), block.variantCondition(), block.namePlace().line, block.isChoice()));
    return blocks;
}

py::object orNone(const std::optional<std::string>& text) {
    return text ? py::object(py::str(*text)) : py::none();
}

py::tuple tupleOf(const Finding& finding) {
    py::list follows;
    for (const RelatedPlace& related : finding.follows)
        follows.append(py::make_tuple(related.place.name, related.place.line, related.text));
    return py::make_tuple(finding.kind, finding.place.name, finding.place.line, finding.place.column,
                          sentenceOf(finding), finding.condition, orNone(finding.proposed), finding.witness,
                          finding.because, follows);
}

/// The findings, and the places and sentences of what could not be read or decided.
py::tuple check(const VTRootBD& model, const std::string& file, bool bits32, bool why, bool merges,
                const std::vector<std::string>& assumptions) {
    Collector collector;
    {
        static std::mutex one;
        const py::gil_scoped_release release;
        const std::lock_guard lock(one);
        ModelCheckOptions options;
        options.bits32 = bits32;
        options.why = why;
        options.merges = merges;
        options.assumptions = assumptions;
        ModelCheck(model, file, options).run(collector);
    }
    py::list findings;
    for (const Finding& finding : collector.findings)
        findings.append(tupleOf(finding));
    py::list problems;
    for (const Collector::Problem& problem : collector.problems)
        problems.append(py::make_tuple(problem.place.name, problem.place.line, problem.sentence));
    return py::make_tuple(findings, problems, collector.notes);
}

} // namespace

void addModels(py::module_& module) {
    py::class_<VTRootBD, std::shared_ptr<VTRootBD>>(module, "Model")
        .def_static("read", &read, py::arg("json"))
        .def_property_readonly("name", &VTRootBD::name)
        .def_property_readonly("is_quill", &VTRootBD::isQuill)
        .def("blocks", &blocksOf)
        .def("check", &check, py::arg("file"), py::arg("bits32"), py::arg("why"), py::arg("merges"),
             py::arg("assumptions"));
}

} // namespace vtsym::python
