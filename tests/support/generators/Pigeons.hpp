// A condition that is false for a reason that no search finds quickly.
#pragma once

#include <string>

namespace VT::Testing {

/// One more pigeon than there are holes, each in some hole and no two in the same.
inline std::string pigeons(int holes) {
    const auto isIn = [](int pigeon, int hole) { return "p" + std::to_string(pigeon) + "_" + std::to_string(hole); };
    std::string all;
    for (int pigeon = 0; pigeon <= holes; ++pigeon) {
        all += pigeon > 0 ? " && (" : "(";
        for (int hole = 0; hole < holes; ++hole)
            all += (hole > 0 ? " || " : "") + isIn(pigeon, hole);
        all += ")";
    }
    for (int hole = 0; hole < holes; ++hole)
        for (int one = 0; one <= holes; ++one)
            for (int other = 0; other < one; ++other)
                all += " && !(" + isIn(one, hole) + " && " + isIn(other, hole) + ")";
    return all;
}

} // namespace VT::Testing
