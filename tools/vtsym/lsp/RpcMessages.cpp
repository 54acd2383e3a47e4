// Reads and writes messages with nlohmann-json.  The nesting of a text is measured before it is parsed, since values
// are copied and written recursively.  Linear.
#include "tools/vtsym/lsp/RpcMessages.hpp"

#include "tools/vtsym/lsp/ServerBounds.hpp"

#include <algorithm>

namespace vtsym {

namespace {

/// How deep the brackets of a text nest outside of its strings.
std::size_t nestingOf(std::string_view json) {
    std::size_t deepest = 0;
    std::size_t depth = 0;
    bool isInString = false;
    for (std::size_t i = 0; i < json.size(); ++i) {
        const char c = json[i];
        if (isInString) {
            i += c == '\\' ? 1U : 0U;
            isInString = c != '"';
        } else if (c == '"') {
            isInString = true;
        } else if (c == '{' || c == '[') {
            deepest = std::max(deepest, ++depth);
        } else if ((c == '}' || c == ']') && depth > 0) {
            --depth;
        }
    }
    return deepest;
}

std::string dumped(const Json& message) {
    return message.dump(-1, ' ', false, Json::error_handler_t::replace);
}

[[noreturn]] void refuseParams(std::string_view path, const char* wanted) {
    throw RpcFault(RpcError::InvalidParams, "params: " + std::string(path) + " is not " + wanted);
}

} // namespace

RpcMessage readRpc(std::string_view text, Json& id) {
    id = nullptr;
    if (nestingOf(text) > mostNesting)
        throw RpcFault(RpcError::InvalidRequest,
                       "the message nests deeper than " + std::to_string(mostNesting) + " levels");
    Json message;
    try {
        message = Json::parse(text);
    } catch (const Json::exception& error) {
        const std::string_view what = error.what(); // "[json.exception...] parse error ..."
        throw RpcFault(RpcError::ParseError, "the message is not JSON: " +
                                                 std::string(what.substr(std::min(what.find(']') + 2, what.size()))));
    }
    if (!message.is_object())
        throw RpcFault(RpcError::InvalidRequest, "the message is not an object");
    RpcMessage read;
    if (const auto member = message.find("id"); member != message.end()) {
        const bool isId = member->is_number_integer() || member->is_string();
        if (!isId && !(member->is_null() && message.contains("error")))
            throw RpcFault(RpcError::InvalidRequest, "the id of the message is neither an integer nor a text");
        id = *member;
        read.id = *member;
    }
    const auto method = message.find("method");
    read.isResponse = method == message.end() && (message.contains("result") || message.contains("error"));
    if (read.isResponse)
        return read;
    if (method == message.end() || !method->is_string())
        throw RpcFault(RpcError::InvalidRequest, "the message has no method that is a text");
    read.method = method->get<std::string>();
    if (const auto params = message.find("params"); params != message.end())
        read.params = std::move(*params);
    return read;
}

std::string rpcResult(const Json& id, Json result) {
    return dumped({{"jsonrpc", "2.0"}, {"id", id}, {"result", std::move(result)}});
}

std::string rpcError(const Json& id, RpcError error, const std::string& sentence) {
    return dumped(
        {{"jsonrpc", "2.0"}, {"id", id}, {"error", {{"code", static_cast<int>(error)}, {"message", sentence}}}});
}

std::string rpcNotification(std::string_view method, Json params) {
    return dumped({{"jsonrpc", "2.0"}, {"method", method}, {"params", std::move(params)}});
}

const Json* memberAt(const Json& object, std::string_view path) {
    const Json* at = &object;
    while (!path.empty()) {
        const std::string_view name = path.substr(0, path.find('/'));
        path.remove_prefix(std::min(name.size() + 1, path.size()));
        if (!at->is_object())
            return nullptr;
        const auto member = at->find(name);
        if (member == at->end())
            return nullptr;
        at = &*member;
    }
    return at;
}

std::string textAt(const Json& object, std::string_view path) {
    const Json* const member = memberAt(object, path);
    if (member == nullptr || !member->is_string())
        refuseParams(path, "a text");
    return member->get<std::string>();
}

std::uint64_t numberAt(const Json& object, std::string_view path) {
    const Json* const member = memberAt(object, path);
    if (member == nullptr || !member->is_number_unsigned())
        refuseParams(path, "a number from 0");
    return member->get<std::uint64_t>();
}

bool flagAt(const Json& object, std::string_view path) {
    const Json* const member = memberAt(object, path);
    return member != nullptr && member->is_boolean() && member->get<bool>();
}

} // namespace vtsym
