// The requests and notifications that the server knows.
#include "tools/vtsym/findings/SourceFiles.hpp"
#include "tools/vtsym/io/Uris.hpp"
#include "tools/vtsym/lsp/LanguageServer.hpp"
#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <algorithm>
#include <array>

namespace vtsym {

namespace {

constexpr int incrementalSync = 2;
constexpr int errorMessage = 1;

constexpr auto cLanguages = std::to_array<std::string_view>({"c", "objective-c", "objc"});
constexpr auto cppLanguages =
    std::to_array<std::string_view>({"cpp", "c++", "cuda", "cuda-cpp", "objective-cpp", "objcpp"});
constexpr auto jsonLanguages = std::to_array<std::string_view>({"json", "jsonc"});

/// The kind of a document, by its path or by the language that the editor has for it.
DocumentKind kindOf(const std::string& path, const std::string& language) {
    const auto isOneOf = [&language](const auto& languages) {
        return std::ranges::find(languages, language) != languages.end();
    };
    if (isSourcePath(path))
        return isCppPath(path) ? DocumentKind::Cpp : DocumentKind::C;
    if (path.ends_with(".json") || isOneOf(jsonLanguages))
        return DocumentKind::Json;
    if (isOneOf(cppLanguages))
        return DocumentKind::Cpp;
    return isOneOf(cLanguages) ? DocumentKind::C : DocumentKind::Other;
}

TextPosition positionAt(const Json& params, const std::string& path) {
    return {numberAt(params, path + "/line"), numberAt(params, path + "/character")};
}

bool holdsText(const Json* list, std::string_view text) {
    return list != nullptr && list->is_array() &&
           std::ranges::any_of(*list, [&](const Json& each) { return each.is_string() && each == text; });
}

void requireSize(std::size_t bytes) {
    if (bytes > mostBytes)
        throw RpcFault(RpcError::InvalidParams, "the document is larger than " + sizeText(mostBytes));
}

} // namespace

void LanguageServer::readAbilities(const Json& capabilities) {
    const Json* const formats = memberAt(capabilities, "textDocument/hover/contentFormat");
    abilities_.markdown = formats == nullptr || holdsText(formats, "markdown");
    abilities_.nestedSymbols = flagAt(capabilities, "textDocument/documentSymbol/hierarchicalDocumentSymbolSupport");
    abilities_.literalActions = memberAt(capabilities, "textDocument/codeAction/codeActionLiteralSupport") != nullptr;
    abilities_.versionedEdits = flagAt(capabilities, "workspace/workspaceEdit/documentChanges");
    abilities_.relatedPlaces = flagAt(capabilities, "textDocument/publishDiagnostics/relatedInformation");
    const Json* const tags = memberAt(capabilities, "textDocument/publishDiagnostics/tagSupport");
    abilities_.tags = tags != nullptr && !tags->is_null() && *tags != Json(false);
}

Json LanguageServer::initialize(const Json& params) {
    if (const Json* const capabilities = memberAt(params, "capabilities"))
        readAbilities(*capabilities);
    state_ = State::Running;
    const Json* const folders = memberAt(params, "workspaceFolders");
    if (folders != nullptr && folders->is_array()) {
        for (const Json& folder : *folders)
            addFolder(textAt(folder, "uri"));
    } else if (const Json* const root = memberAt(params, "rootUri"); root != nullptr && root->is_string()) {
        addFolder(root->get<std::string>());
    } else if (const Json* const path = memberAt(params, "rootPath"); path != nullptr && path->is_string()) {
        addFolder(uriOf(path->get<std::string>()));
    }
    return {{"capabilities",
             {{"positionEncoding", "utf-16"},
              {"textDocumentSync", {{"openClose", true}, {"change", incrementalSync}, {"save", true}}},
              {"hoverProvider", true},
              {"documentSymbolProvider", true},
              {"codeActionProvider", {{"codeActionKinds", {"quickfix", "source.fixAll.vtsym"}}}},
              {"workspace", {{"workspaceFolders", {{"supported", true}, {"changeNotifications", true}}}}}}},
            {"serverInfo", {{"name", "vtsym"}, {"version", VTSYM_VERSION}}}};
}

Json LanguageServer::shutDown(const Json&) {
    state_ = State::ShutDown;
    documents_.clear();
    return nullptr;
}

void LanguageServer::addFolder(const std::string& uri) {
    const std::optional<std::string> path = pathOf(uri);
    if (!path || !path->starts_with('/'))
        return;
    projects_.emplace_back(*path, [this](const std::string& sentence) {
        send_(rpcNotification("window/showMessage", {{"type", errorMessage}, {"message", sentence}}));
    });
}

/// The innermost project that a document is in; the last one is for those that are in none.
ProjectFolder& LanguageServer::projectOf(const std::string& uri) {
    const std::string path = pathOf(uri).value_or("");
    ProjectFolder* best = nullptr;
    ProjectFolder* without = nullptr;
    for (ProjectFolder& project : projects_) {
        if (project.folder().empty())
            without = &project;
        else if (project.holds(path) && (best == nullptr || project.folder().size() > best->folder().size()))
            best = &project;
    }
    if (best != nullptr)
        return *best;
    return without != nullptr ? *without : projects_.emplace_back("", [](const std::string&) {});
}

/// Gives a document the path and the kind that it has in its project.
void LanguageServer::assign(OpenDocument& document) {
    const std::string& language = languages_[document.uri];
    const std::optional<std::string> path = pathOf(document.uri);
    document.kind = kindOf(path.value_or(""), language);
    document.path = path ? projectOf(document.uri).relative(*path) : document.uri;
    if (!isSourcePath(document.path) && document.kind == DocumentKind::Cpp)
        document.path += ".cpp"; // the scanner goes by the path
    document.analysis.reset();
    document.isSent = false;
}

void LanguageServer::open(const Json& params) {
    const std::string uri = textAt(params, "textDocument/uri");
    std::string text = textAt(params, "textDocument/text");
    requireSize(text.size());
    const Json* const language = memberAt(params, "textDocument/languageId");
    const Json* const version = memberAt(params, "textDocument/version");
    documents_.erase(uri);
    languages_[uri] = language != nullptr && language->is_string() ? language->get<std::string>() : "";
    OpenDocument& document =
        documents_.emplace(uri, OpenDocument{uri, {}, {}, {}, TextDocument(std::move(text))}).first->second;
    if (version != nullptr && version->is_number_integer())
        document.version = version->get<std::int64_t>();
    refreshProjects();
    assign(document);
}

void LanguageServer::change(const Json& params) {
    OpenDocument& document = documentOf(params);
    const Json* const changes = memberAt(params, "contentChanges");
    if (changes == nullptr || !changes->is_array())
        throw RpcFault(RpcError::InvalidParams, "params: contentChanges is not a list");
    document.analysis.reset();
    document.isSent = false;
    if (const Json* const version = memberAt(params, "textDocument/version");
        version != nullptr && version->is_number_integer())
        document.version = version->get<std::int64_t>();
    for (const Json& each : *changes) {
        std::string text = textAt(each, "text");
        if (memberAt(each, "range") == nullptr) {
            requireSize(text.size());
            document.text.replaceAll(std::move(text));
            continue;
        }
        requireSize(document.text.text().size() + text.size());
        document.text.replace(positionAt(each, "range/start"), positionAt(each, "range/end"), text);
    }
}

void LanguageServer::save(const Json& params) {
    documentOf(params);
    refreshProjects();
}

void LanguageServer::close(const Json& params) {
    const OpenDocument& document = documentOf(params);
    if (document.kind != DocumentKind::Other)
        send_(rpcNotification("textDocument/publishDiagnostics",
                              {{"uri", document.uri}, {"diagnostics", Json::array()}}));
    languages_.erase(document.uri);
    documents_.erase(textAt(params, "textDocument/uri"));
}

void LanguageServer::changeFolders(const Json& params) {
    if (const Json* const removed = memberAt(params, "event/removed"); removed != nullptr && removed->is_array()) {
        for (const Json& folder : *removed)
            if (const auto path = pathOf(textAt(folder, "uri")))
                projects_.remove_if([&](const ProjectFolder& project) { return project.folder() == *path; });
    }
    if (const Json* const added = memberAt(params, "event/added"); added != nullptr && added->is_array())
        for (const Json& folder : *added)
            addFolder(textAt(folder, "uri"));
    for (auto& [uri, document] : documents_)
        assign(document);
}

void LanguageServer::checkFiles(const Json&) {
    refreshProjects();
}

/// Analyses every document anew where settings changed.
void LanguageServer::refreshProjects() {
    bool isChanged = false;
    for (ProjectFolder& project : projects_)
        isChanged = project.refresh() || isChanged;
    if (isChanged)
        for (auto& [uri, document] : documents_)
            assign(document);
}

Json LanguageServer::hover(const Json& params) {
    const TextPosition position = positionAt(params, "position");
    const OpenDocument& document = analysed(params);
    return hoverAt(document, document.text.byteOf(position), abilities_);
}

Json LanguageServer::codeActions(const Json& params) {
    const TextPosition begin = positionAt(params, "range/start");
    const TextPosition end = positionAt(params, "range/end");
    const OpenDocument& document = analysed(params);
    const Json* const only = memberAt(params, "context/only");
    const auto [first, last] = std::minmax({document.text.byteOf(begin), document.text.byteOf(end)});
    return actionsFor(document, first, last, only != nullptr ? *only : Json(nullptr), abilities_);
}

Json LanguageServer::documentSymbols(const Json& params) {
    return symbolsOf(analysed(params), abilities_);
}

} // namespace vtsym
