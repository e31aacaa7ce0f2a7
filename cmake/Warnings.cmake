# Warnings, hardening and files of any size for every target.

# Formats go through functions that add the caller's line, so they are no literals where printf is called.
add_compile_options(-Wall -Wextra -Wpedantic -Wshadow -Wconversion -Wnon-virtual-dtor
  -Woverloaded-virtual -Wcast-align -Wformat=2
  -Wno-format-nonliteral -Wno-format-security)
if(ZELKORA_WERROR)
  add_compile_options(-Werror)
endif()

add_compile_options(-fstack-protector-strong)
add_compile_definitions(_GLIBCXX_ASSERTIONS _FILE_OFFSET_BITS=64)
add_link_options(-Wl,-z,relro,-z,now,-z,noexecstack)
