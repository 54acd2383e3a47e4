// Writes nested JSON objects with an explicit stack; a node that was written before is its identifier alone, so the
// size is linear in the nodes.
#include "base/core/Nodes.hpp"
#include "base/util/IdMap.hpp"
#include "tools/vtsym/answers/NodeText.hpp"
#include "tools/vtsym/answers/TreeWriters.hpp"
#include "tools/vtsym/io/Json.hpp"

#include <vector>

namespace vtsym {

namespace {

/// A node without its operands and without the closing brace.
std::string opened(const VT::SymbolicExpr& node, VT::SymbolicExprId id) {
    std::string json = "{\"kind\":" + jsonString(VT::operatorInfo(node.op()).className);
    appendMember(json, "op", std::to_string(static_cast<int>(node.op())));
    appendMember(json, "id", std::to_string(id));
    if (const auto* name = dynamic_cast<const VT::SymbolicString*>(&node))
        appendMember(json, "text", jsonString(name->getName()));
    else if (node.isNumValue())
        appendMember(json, "value", jsonNumber(node.getNumValue()));
    else if (const auto* member = dynamic_cast<const VT::SymbolicMemberValue*>(&node))
        appendMember(json, "name", jsonString(member->getMemberName()));
    return json;
}

} // namespace

void appendJsonTree(const VT::SymbolicExprTable& table, VT::SymbolicExprId root, std::string& out) {
    struct Level {
        const VT::SymbolicExpr* node;
        std::size_t next;
    };

    std::vector<Level> levels;
    VT::IdMap<bool> written;
    const auto write = [&](VT::SymbolicExprId id) {
        const VT::SymbolicExpr& node = *table.get(id);
        if (!isOperator(node)) {
            out.append(opened(node, id)).append("}");
        } else if (written.find(id) != nullptr) {
            out.append("{\"id\":").append(std::to_string(id)).append("}");
        } else {
            written.insert(id, true);
            out.append(opened(node, id)).append(",\"inputs\":[");
            levels.push_back({&node, 0});
        }
    };
    write(root);
    while (!levels.empty()) {
        Level& level = levels.back();
        if (level.next == level.node->getNumInputs()) {
            out.append("]}");
            levels.pop_back();
            continue;
        }
        if (level.next > 0)
            out.append(",");
        write(level.node->getInput(level.next++));
    }
}

} // namespace vtsym
