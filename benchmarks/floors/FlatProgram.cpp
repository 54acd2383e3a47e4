// Each operator jumps to the next one itself, so that the processor predicts a jump by where it comes from.
#include "benchmarks/floors/FlatProgram.hpp"

#include <bit>
#include <stdexcept>

namespace Floor {

/// Operands lie before their operators, so the records up to the root are the cells.
FlatProgram::FlatProgram(const FlatTable& table, std::uint32_t root) : cells_(root + 1) {
    for (std::uint32_t id = 0; id <= root; ++id) {
        const Record& record = table[id];
        switch (record.kind) {
        case Kind::Name:
            variables_.push_back(id);
            break;
        case Kind::Integer:
            cells_[id] = static_cast<std::int32_t>(record.left);
            break;
        case Kind::Real:
            cells_[id] = std::bit_cast<double>(std::uint64_t{record.left} << 32U | record.right);
            break;
        case Kind::Plus:
        case Kind::Minus:
        case Kind::Times:
        case Kind::Divide:
        case Kind::Less:
        case Kind::Greater:
        case Kind::And:
        case Kind::Or:
            code_.push_back({record.kind, id, record.left, record.right});
            break;
        default:
            throw std::invalid_argument("the floor does not know this operator");
        }
    }
    code_.push_back({Kind::Row, 0, 0, 0}); // the end
}

#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wpedantic" // addresses of labels

double FlatProgram::run() {
    static const void* const places[] = {
        &&end, &&end, &&end,  &&either, &&both,  &&end,    &&end, &&end, &&end, &&end, &&less, &&end, &&greater, &&end,
        &&end, &&end, &&plus, &&minus,  &&times, &&divide, &&end, &&end, &&end, &&end, &&end,  &&end, &&end,     &&end};
    double* const cells = cells_.data();
    const Line* line = code_.data();
#define FLOOR_NEXT goto* places[static_cast<std::size_t>((++line)->kind)]
    goto* places[static_cast<std::size_t>(line->kind)];
plus:
    cells[line->result] = cells[line->left] + cells[line->right];
    FLOOR_NEXT;
minus:
    cells[line->result] = cells[line->left] - cells[line->right];
    FLOOR_NEXT;
times:
    cells[line->result] = cells[line->left] * cells[line->right];
    FLOOR_NEXT;
divide:
    cells[line->result] = cells[line->left] / cells[line->right];
    FLOOR_NEXT;
less:
    cells[line->result] = cells[line->left] < cells[line->right] ? 1 : 0;
    FLOOR_NEXT;
greater:
    cells[line->result] = cells[line->left] > cells[line->right] ? 1 : 0;
    FLOOR_NEXT;
both:
    cells[line->result] = (cells[line->left] != 0) & (cells[line->right] != 0) ? 1 : 0;
    FLOOR_NEXT;
either:
    cells[line->result] = (cells[line->left] != 0) | (cells[line->right] != 0) ? 1 : 0;
    FLOOR_NEXT;
#undef FLOOR_NEXT
end:
    return cells_.back();
}

#pragma GCC diagnostic pop

} // namespace Floor
