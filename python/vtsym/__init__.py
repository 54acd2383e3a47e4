"""Simplify, compare, decide and evaluate conditions over integers.

>>> import vtsym
>>> vtsym.parse("x > 2 && x != 3 && x < 5").shortest()
Condition('x==4')
"""

from vtsym._vtsym import version as __version__
from vtsym.conditions import Condition, Expression, Symbol, covers, dimension, disjoint, parse
from vtsym.context import Context
from vtsym.errors import EvaluationError, ModelError, ParseError, SourceError, VtsymError
from vtsym.models import Block, Model, ModelFinding, Report
from vtsym.results import Decision, Reasons, Relation, SetDecision
from vtsym.scanning import Reason, SourceFinding, scan, scan_text, source_files

__all__ = [
    "Block",
    "Condition",
    "Context",
    "Decision",
    "EvaluationError",
    "Expression",
    "Model",
    "ModelError",
    "ModelFinding",
    "ParseError",
    "Reason",
    "Reasons",
    "Relation",
    "Report",
    "SetDecision",
    "SourceError",
    "SourceFinding",
    "Symbol",
    "VtsymError",
    "__version__",
    "covers",
    "dimension",
    "disjoint",
    "parse",
    "scan",
    "scan_text",
    "source_files",
]
