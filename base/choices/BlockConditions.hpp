// The combined conditions of the host's blocks and ports.
#pragma once

#include "base/service/VCSymbolicExprId.hpp"
#include "host/Model.hpp"

#include <boost/unordered_map.hpp>

namespace VT {

class VCCustomizer;
class VCService;

/// Reads and combines the variant conditions of blocks, each once: a model with n blocks costs n conditions.  Make a
/// new object when the model changes.  The service outlives it.
///
/// A condition that cannot be read throws the host diagnostics of its language.  Conditions read before stay.
class VTSYM_API BlockConditions {
public:
    /// `customizer` replaces the parameters of a block's condition; with nullptr they stay.  It outlives the object.
    explicit BlockConditions(VCService& service, const VCCustomizer* customizer = nullptr)
        : service_(service),
          customizer_(customizer) {}

    /// Whether a block is the default choice, active where no other one is.
    static bool isDefault(const VTBlock& block);
    /// The condition of a block itself.  "(inherit)" and the empty text are TRUE; "(default)" holds where none of
    /// the other choices' conditions does, those that are "(default)" as well left out.
    VCSymbolicExprId own(const VTBlock& block);
    /// Whether a block is active: its own condition and those of all its ancestors, And from the top down.
    VCSymbolicExprId net(const VTBlock& block);
    /// Whether the signal of a port flows: its source is active, and one of its destinations.  That of a port without
    /// destinations is that of its source.
    VCSymbolicExprId of(const vtPort& port);

private:
    VCSymbolicExprId read(const VTBlock& block);
    VCSymbolicExprId readDefault(const VTBlock& block);

    VCService& service_;
    const VCCustomizer* customizer_;
    boost::unordered_map<const VTBlock*, SymbolicExprId> own_;
    boost::unordered_map<const VTBlock*, SymbolicExprId> net_;
};

} // namespace VT
