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
  EXPECT(zv_strireplstr(text, " X ", "*") == 1 && zv_stricmp(text, "WIDTH*height") == 0);
  EXPECT(zv_stristr(text, "HEIGHT") == text + 6);
  EXPECT(zv_strpat("picture.png", "*.[pj][np]g") == 1);
}

static void lists(void) {
  char** list = NULL;
  EXPECT(zv_strlist(&list, "one,three,", ',') == 2);
  EXPECT(zv_strlist_insert(&list, 2, 1, "two") == 1);
  EXPECT(zv_strlist_len(list) == 3 && zv_strlist_iidx(list, -1, "THREE") == 2);
  EXPECT(zv_strlist_free(list, 3) == 0);
}

static void paths_and_host(void) {
  char path[ZV_PATH_MAX] = "a\\.\\b/../c.txt";
  char folder[ZV_PATH_MAX], out[ZV_PATH_MAX];
  EXPECT(zv_normalize_path(path) == 1 && strcmp(path, "a/c.txt") == 0);
  EXPECT(zv_getcwd(folder, sizeof folder) == 1);
  EXPECT(zv_absolute(path, NULL, out, sizeof out) == 1);
  EXPECT(zv_relative(out, folder, out, sizeof out) == 1 && strcmp(out, path) == 0);
  EXPECT(zv_extract_extension(path, out, sizeof out) == 1 && strcmp(out, ".txt") == 0);
  EXPECT(zv_username(out, sizeof out) > 0);
}

static void environment_and_files(void) {
  struct _stat64 status;
  char* value;
  FILE* file = fopen("consumer.txt", "wb");
  EXPECT(file != NULL && fputs("text", file) >= 0 && fclose(file) == 0);
  EXPECT(zv_copy("consumer.txt", "consumer.copy") == 0);
  EXPECT(zv_stat("consumer.copy", &status) == 0 && status.st_size == 4);
  EXPECT(zv_putenv_private("LIB", "plugins", 0) == 1);
  value = zv_getenv_private("LIB");
  EXPECT(value != NULL && strcmp(value, "plugins") == 0);
  zv_free(value);
}

int main(void) {
  memory_and_version();
  strings();
  lists();
  paths_and_host();
  environment_and_files();
  if (failures == 0) puts("consumer: ok");
  return failures != 0;
}
