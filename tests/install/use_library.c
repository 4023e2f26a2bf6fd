/* A C program that knows the library only through its installed header and pkg-config. It runs
 * with the host stand-in linked in and the driver stand-in on the library path. */
#include <kvsvapi.h>
#include <stdio.h>
#include <string.h>

int main(void) {
  /* A duration of 5 s and 300 ns, and back. */
  SvTime time;
  uint64_t raw = 0;
  kvsvRawTimeToSvTime(&time, 50000003ull);
  kvsvSvTimeToRawTime(&raw, &time);
  if (time.seconds != 5 || time.fraction != 3 * 1844674407371ull || raw != 50000003ull) {
    fprintf(stderr, "time conversion: %lld s, raw %llu\n", (long long)time.seconds,
            (unsigned long long)raw);
    return 1;
  }
  /* No session was ever made: its slot is empty. */
  SvHandle frames = 0, spares = 0;
  const kvsvStatus status = kvsvReadFrameCAN(0x20000001u, 1, &frames, &spares, 0.0);
  if (status != kvErrInvalidSession) {
    fprintf(stderr, "read on an empty slot gave 0x%08X\n", (unsigned)status);
    return 1;
  }
  char text[256] = "";
  kvsvStatusToString(status, sizeof text, text);
  if (strlen(text) == 0) {
    fprintf(stderr, "no text for 0x%08X\n", (unsigned)status);
    return 1;
  }
  printf("installed library works: %s\n", text);
  return 0;
}
