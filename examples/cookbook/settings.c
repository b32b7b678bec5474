/* Reads the settings file that lies beside the program, wherever the program is started from. */
#include <stdio.h>
#include <string.h>
#include <zarvo.h>

/* A name that a shell was given without a folder is that of a file in the search path or in the
   working directory, on Windows perhaps without its extension. */
static int find_program(const char* started_as, char* path) {
  static const char* const endings[] = {"", ".exe"};
  for (int i = 0; i < 2; ++i) {
    const int length = snprintf(path, ZV_PATH_MAX, "%s%s", started_as, endings[i]);
    if (length >= ZV_PATH_MAX) return 0;
    zv_strreplchr(path, '\\', '/');
    if (*zv_slash(path) != '\0' || zv_path_locate(path) || zv_access(path, 0) == 0) return 1;
  }
  return 0;
}

static int find_beside_program(const char* started_as, const char* name, char* path) {
  char folder[ZV_PATH_MAX];
  if (!find_program(started_as, path)) return 0;
  if (zv_ispath_relative(path) && !zv_absolute(path, NULL, path, ZV_PATH_MAX)) return 0;
  zv_extract_directory(path, folder, sizeof folder);
  return zv_absolute(name, folder, path, ZV_PATH_MAX);
}

static int print_setting(char* line, int number) {
  char* value = strchr(line, '=');
  if (zv_strtrim(line) == 0 || *line == '#') return 1;
  if (value == NULL) {
    fprintf(stderr, "settings: line %d has no value: %s\n", number, line);
    return 0;
  }
  *value++ = '\0';
  zv_strtrim(line);
  zv_strtrim(value);
  printf("%s is \"%s\"\n", line, value);
  return 1;
}

int main(int argc, char** argv) {
  char path[ZV_PATH_MAX], line[1024];
  FILE* file = NULL;
  int number = 0, good = 1;
  if (argc > 0 && find_beside_program(argv[0], "settings.ini", path))
    file = zv_fopen(path, "r", NULL);
  if (file == NULL) {
    fprintf(stderr, "settings: there is no settings.ini beside the program\n");
    return 1;
  }
  while (good && zv_fgets(line, sizeof line, file, 1) != NULL) good = print_setting(line, ++number);
  if (ferror(file)) fprintf(stderr, "settings: cannot read %s\n", path);
  good = good && !ferror(file);
  zv_fclose(file);
  return good ? 0 : 1;
}
