// Messages of JSON-RPC 2.0, and what is wrong with them.
#pragma once

#include <nlohmann/json.hpp>

#include <stdexcept>
#include <string>
#include <string_view>

namespace vtsym {

using Json = nlohmann::json;

/// The errors of JSON-RPC and of the protocol of language servers.
enum class RpcError : int {
    ParseError = -32700,
    InvalidRequest = -32600,
    MethodNotFound = -32601,
    InvalidParams = -32602,
    InternalError = -32603,
    ServerNotInitialized = -32002,
    RequestCancelled = -32800,
    ContentModified = -32801,
};

/// A message that cannot be answered.
class RpcFault : public std::runtime_error {
public:
    RpcFault(RpcError error, const std::string& sentence) : std::runtime_error(sentence), error_(error) {}

    [[nodiscard]] RpcError error() const noexcept { return error_; }

private:
    RpcError error_;
};

/// A request, or a notification, which has no identifier.
struct RpcMessage {
    Json id = nullptr; ///< an integer or a text; null for a notification
    std::string method;
    Json params = nullptr;
    bool isResponse = false; ///< to a request of the server

    [[nodiscard]] bool isRequest() const noexcept { return !id.is_null(); }
};

/// Reads a message.  Throws RpcFault for a text that is not one; `id` is that of the message then, as far as it is
/// known.
RpcMessage readRpc(std::string_view text, Json& id);

// Texts of messages.
std::string rpcResult(const Json& id, Json result);
std::string rpcError(const Json& id, RpcError error, const std::string& sentence);
std::string rpcNotification(std::string_view method, Json params);

/// The member of an object with a path of names, separated by slashes; nullptr where there is none.
const Json* memberAt(const Json& object, std::string_view path);
/// The same of a type; throws RpcFault where there is none, or one of another type.
std::string textAt(const Json& object, std::string_view path);
std::uint64_t numberAt(const Json& object, std::string_view path);
/// Whether a member is there and true.
bool flagAt(const Json& object, std::string_view path);

} // namespace vtsym
