# The layers of the library and the program: their folders, and the arrows between them.  The build links the library by this
# table, and a test checks every #include against it.  A layer may use what its arrows reach.

set(VTSYM_LAYERS host util core variants integer cover text transform print simplify decide eval parser service choices scan
    embedded)
set(VTSYM_PROGRAM_LAYERS io answers findings lsp commands program)

# The first folder of a layer and those inside it that belong to it too.
set(VTSYM_FOLDERS_host host)
set(VTSYM_FOLDERS_util base/util)
set(VTSYM_FOLDERS_core base/core)
set(VTSYM_FOLDERS_variants base/variants)
set(VTSYM_FOLDERS_integer base/integer)
set(VTSYM_FOLDERS_cover base/cover)
set(VTSYM_FOLDERS_text base/text)
set(VTSYM_FOLDERS_transform base/transform)
set(VTSYM_FOLDERS_print base/print)
set(VTSYM_FOLDERS_simplify base/simplify)
set(VTSYM_FOLDERS_decide base/decide base/decide/circuit base/decide/diagram base/decide/external base/decide/reasons
    base/decide/search base/decide/shorten base/decide/solver base/decide/witness)
set(VTSYM_FOLDERS_eval base/eval)
set(VTSYM_FOLDERS_parser parser)
set(VTSYM_FOLDERS_service base/service)
set(VTSYM_FOLDERS_choices base/choices base/choices/boxes)
set(VTSYM_FOLDERS_scan base/scan base/scan/build base/scan/changes base/scan/facts base/scan/regions
    base/scan/report base/scan/text)
set(VTSYM_FOLDERS_embedded host/embedded)
set(VTSYM_FOLDERS_io tools/vtsym/io tools/vtsym/io/manual)
set(VTSYM_FOLDERS_answers tools/vtsym/answers)
set(VTSYM_FOLDERS_findings tools/vtsym/findings tools/vtsym/findings/cache tools/vtsym/findings/source)
set(VTSYM_FOLDERS_lsp tools/vtsym/lsp)
set(VTSYM_FOLDERS_commands tools/vtsym/commands)
set(VTSYM_FOLDERS_program tools/vtsym)

set(VTSYM_ARROWS_host)
set(VTSYM_ARROWS_util)
set(VTSYM_ARROWS_core util host)
set(VTSYM_ARROWS_variants host)
set(VTSYM_ARROWS_integer core)
set(VTSYM_ARROWS_cover integer)
set(VTSYM_ARROWS_text core)
set(VTSYM_ARROWS_transform core variants)
set(VTSYM_ARROWS_print transform text)
set(VTSYM_ARROWS_simplify print cover)
set(VTSYM_ARROWS_decide print cover)
set(VTSYM_ARROWS_eval print)
set(VTSYM_ARROWS_parser print)
set(VTSYM_ARROWS_service parser simplify decide eval)
set(VTSYM_ARROWS_choices service)
set(VTSYM_ARROWS_scan decide)
set(VTSYM_ARROWS_embedded host)
set(VTSYM_ARROWS_io host)
set(VTSYM_ARROWS_answers io service)
set(VTSYM_ARROWS_findings io choices scan embedded)
set(VTSYM_ARROWS_lsp findings)
set(VTSYM_ARROWS_commands answers lsp)
set(VTSYM_ARROWS_program commands)

# The front doors, each one header in base/ itself.
set(VTSYM_DOOR_core base/VTSymbolicExpr.hpp)
set(VTSYM_DOOR_service base/VCService.hpp)

# Libraries that only some layers may include, by the beginning of the header's name.
set(VTSYM_GUARDED_HEADERS toml++/ fmt/ spdlog/ boost/spirit boost/phoenix boost/fusion CLI/ nlohmann/ histedit editline gtest/ rapidcheck
    oneapi/ xxhash.h)
set(VTSYM_HEADERS_embedded fmt/ spdlog/ nlohmann/)
set(VTSYM_HEADERS_parser boost/spirit boost/phoenix boost/fusion)
set(VTSYM_HEADERS_findings nlohmann/ toml++/ xxhash.h)
set(VTSYM_HEADERS_lsp nlohmann/)
set(VTSYM_HEADERS_io CLI/ nlohmann/ histedit editline oneapi/)

# All layers that `layer` may use, itself included.
function(vtsym_reach layer result)
  set(reached)
  set(open ${layer})
  while(open)
    list(POP_FRONT open next)
    if(NOT next IN_LIST reached)
      list(APPEND reached ${next})
      list(APPEND open ${VTSYM_ARROWS_${next}})
    endif()
  endwhile()
  set(${result} ${reached} PARENT_SCOPE)
endfunction()
