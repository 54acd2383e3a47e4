/* What the boards have.  BOARD is set by the build, 1 to 4. */
#if BOARD <= 0 || BOARD > 4
#error "unknown board"
#endif

#if BOARD >= 3
#define FLASH_KB 512
#elif BOARD == 2 || BOARD == 1
#define FLASH_KB 128
#elif BOARD == 3
#define FLASH_KB 256
#endif
