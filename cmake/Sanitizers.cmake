# AddressSanitizer and UndefinedBehaviorSanitizer for the whole build when VT_SANITIZE is on.
if(VT_SANITIZE)
  add_compile_options(-fsanitize=address,undefined -fno-sanitize-recover=undefined -fno-omit-frame-pointer)
  add_link_options(-fsanitize=address,undefined)
endif()

# ThreadSanitizer, for the concurrent-render tests (a build of its own: it cannot join the others).
option(VT_SANITIZE_THREAD "Build with ThreadSanitizer" OFF)
if(VT_SANITIZE_THREAD)
  add_compile_options(-fsanitize=thread -fno-omit-frame-pointer)
  add_link_options(-fsanitize=thread)
endif()
