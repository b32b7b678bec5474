/* PNG and JPEG through stb_image: one source, compiled once for each of the two plugins. */
#include <limits.h>

#include "reader.h"

#define STB_IMAGE_IMPLEMENTATION
#define STBI_NO_STDIO
#define STBI_NO_FAILURE_STRINGS
#define STBI_MAX_DIMENSIONS 16384
#if defined(GALLERY_PNG)
#define STBI_ONLY_PNG
#else
#define STBI_ONLY_JPEG
#endif
#include "stb_image.h"

#if defined(GALLERY_PNG)
const char picture_formats[] = "PNG image|.png|\0";
#else
const char picture_formats[] = "JPEG image|.jpg|.jpeg|\0";
#endif

int decode_picture(bytes_t file, img_picture_t* picture) {
  int channels = 0;
  stbi_uc* pixels;
  if (file.size > INT_MAX) return 0;
  pixels = stbi_load_from_memory(file.data, (int)file.size, &picture->width, &picture->height,
                                 &channels, 3);
  if (pixels == NULL) return 0;
  /* The host frees with zv_free() what it gets, and stb_image has a heap of its own choice. */
  picture->rgb =
      (unsigned char*)zv_dalloc(pixels, (size_t)picture->width * (size_t)picture->height * 3);
  stbi_image_free(pixels);
  return picture->rgb != NULL;
}
