/* An application of the installed package, in C99: a little of each family, each result looked at.
   Prints what is wrong and ends with 1, or prints "consumer: ok". */
#include <stdio.h>
#include <string.h>
#include <zarvo.h>

static int failures;

static void expect(int truth, const char* what) {
  if (truth) return;
  printf("consumer: not so: %s\n", what);
  ++failures;
}

#define EXPECT(truth) expect((truth) != 0, #truth)

static void memory_and_version(void) {
  int major, minor, patch, ok;
  char release[12];
  char* block = zv_dalloc("abc", 4);
  EXPECT(strcmp(zarvo_version(), "1.0.0b") == 0);
  EXPECT(zv_split_version(zarvo_version(), &major, &minor, &patch, release) == 1);
  EXPECT(major == 1 && minor == 0 && patch == 0 && strcmp(release, "Beta") == 0);
  block = zv_realloc(block, 64, &ok);
  EXPECT(ok == 1 && strcmp(block, "abc") == 0);
  EXPECT(zv_free(block) == 0);
}

static void strings(void) {
  char text[32];
  EXPECT(zv_strncpy(text, "  Width x Height ", sizeof text) == 17);
  EXPECT(zv_strtrim(text) == 14);
  EXPECT(zv_strlwr(text) == 14 && strcmp(text, "width x height") == 0);
  EXPECT(zv_stricmp(text, "WIDTH X height") == 0);
  EXPECT(zv_stristr(text, "HEIGHT") == text + 8);
}

int main(void) {
  memory_and_version();
  strings();
  if (failures == 0) puts("consumer: ok");
  return failures != 0;
}
