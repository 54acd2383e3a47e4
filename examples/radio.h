/* Frames of the radio.  PROTOCOL is set by the build, 1 to 4 so far. */
#if PROTOCOL >= 3
enum { headerBytes = 12, addressBytes = 8 };
#if PROTOCOL >= 2 && defined(CRC)   /* checksums came with protocol 2 */
enum { checksumBytes = 4 };
#endif
#elif PROTOCOL == 2
enum { headerBytes = 8, addressBytes = 4 };
#elif defined(LEGACY) && PROTOCOL > 2
enum { headerBytes = 4, addressBytes = 2 };
#else
#error "unknown protocol"
#endif
