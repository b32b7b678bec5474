/* The API "img", spoken by the gallery and its plugins: read a picture file into memory. */
#ifndef GALLERY_IMG_H
#define GALLERY_IMG_H

#define IMG_API "img"
#define IMG_OLDEST 1 /* the versions that this header describes */
#define IMG_NEWEST 5

/* Rows from top to bottom, three bytes a pixel: red, green, blue. */
typedef struct img_picture_t {
  int width;
  int height;
  unsigned char* rgb; /* from zv_malloc(); whoever asked for the picture frees it */
} img_picture_t;

/* What a plugin's api_entry points to. */
typedef struct img_api_t {
  /* Fills the picture and returns 1; returns 0, and leaves nothing to free, for a file that is no
     sound picture of this format. */
  int (*read)(const char* path, img_picture_t* picture);
} img_api_t;

#endif
