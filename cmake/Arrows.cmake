# The layers of the library: their folders, and the arrows between them.  The build links by this table and a test holds every
# #include against it.  A layer may use what its arrows reach.

set(VTSYM_LAYERS host core variants transform print simplify decide eval parser service scan embedded)

set(VTSYM_FOLDER_host host)
set(VTSYM_FOLDER_core base/core)
set(VTSYM_FOLDER_variants base/variants)
set(VTSYM_FOLDER_transform base/transform)
set(VTSYM_FOLDER_print base/print)
set(VTSYM_FOLDER_simplify base/simplify)
set(VTSYM_FOLDER_decide base/decide)
set(VTSYM_FOLDER_eval base/eval)
set(VTSYM_FOLDER_parser parser)
set(VTSYM_FOLDER_service base/service)
set(VTSYM_FOLDER_scan base/scan)
set(VTSYM_FOLDER_embedded host/embedded)

set(VTSYM_ARROWS_host)
set(VTSYM_ARROWS_core host)
set(VTSYM_ARROWS_variants host)
set(VTSYM_ARROWS_transform core variants)
set(VTSYM_ARROWS_print transform)
set(VTSYM_ARROWS_simplify print)
set(VTSYM_ARROWS_decide print)
set(VTSYM_ARROWS_eval print)
set(VTSYM_ARROWS_parser print)
set(VTSYM_ARROWS_service parser simplify decide eval)
set(VTSYM_ARROWS_scan service)
set(VTSYM_ARROWS_embedded host)

# The two front doors stand in base/ itself.
set(VTSYM_DOOR_core base/VTSymbolicExpr)
set(VTSYM_DOOR_service base/VC)

# Libraries that only some layers may include, by the beginning of the header's name.
set(VTSYM_GUARDED_HEADERS fmt/ spdlog/ boost/spirit boost/phoenix boost/fusion CLI/ nlohmann/ histedit editline gtest/ rapidcheck)
set(VTSYM_HEADERS_embedded fmt/ spdlog/ nlohmann/)
set(VTSYM_HEADERS_parser boost/spirit boost/phoenix boost/fusion)

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
