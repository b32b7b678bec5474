/* An application of the installed package, in C99: calls that take and give each kind of thing that
   crosses the interface. Prints what is wrong and ends with 1, or prints "consumer: ok". */
#include <zarvo.h>

#include <stddef.h>
#include <stdio.h>
#include <string.h>

static int failures;

#define EXPECT(truth) failures += (truth) ? 0 : printf("consumer: not so: %s\n", #truth)

int main(void) {
  char path[ZV_PATH_MAX] = "a\\.\\b/../c.txt";
  char out[ZV_PATH_MAX];
  char** list = NULL;
  char* value;
  struct _stat64 status;
  FILE* const file = fopen("consumer.txt", "wb");

  EXPECT(offsetof(dirsel_t, show_hidden) == 24 && offsetof(zv_plugin_t, module) == 40);
  EXPECT(strcmp(zarvo_version(), "1.0.0b") == 0);
  EXPECT(zv_strlist(&list, "one,three,", ',') == 2);
  EXPECT(zv_strlist_iidx(list, -1, "THREE") == 1 && zv_strlist_free(list, 2) == 0);
  EXPECT(zv_normalize_path(path) == 1 && strcmp(path, "a/c.txt") == 0);
  EXPECT(zv_absolute(path, NULL, out, sizeof out) == 1);
  EXPECT(zv_username(out, sizeof out) > 0);
  EXPECT(zv_putenv_private("LIB", "plugins", 0) == 1);
  value = zv_getenv_private("LIB");
  EXPECT(value != NULL && strcmp(value, "plugins") == 0 && zv_free(value) == 0);
  EXPECT(file != NULL && fputs("text", file) >= 0 && fclose(file) == 0);
  EXPECT(zv_copy("consumer.txt", "consumer.copy") == 0);
  EXPECT(zv_stat("consumer.copy", &status) == 0 && status.st_size == 4);
  if (failures == 0) puts("consumer: ok");
  return failures != 0;
}
