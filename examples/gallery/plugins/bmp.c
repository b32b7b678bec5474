/* BMP without compression: palettes of 1, 4 and 8 bits, and 16, 24 and 32 bits a pixel. */
#include "reader.h"

const char picture_formats[] = "Windows bitmap|.bmp|.dib|\0";

enum { file_header = 14, info_header = 40, masks_at = file_header + info_header };
enum { plain = 0, with_masks = 3 };

/* The file's own description of its pixels. */
typedef struct layout_t {
  size_t width, height, stride;
  unsigned bits; /* a pixel */
  int top_down;
  const unsigned char* palette; /* blue, green, red and an unused byte for each colour */
  size_t colours;
  unsigned long masks[3]; /* red, green, blue */
} layout_t;

/* Numbers are stored with their lowest byte first. */
static unsigned long number(const unsigned char* at, int bytes) {
  unsigned long value = 0;
  while (bytes-- > 0) value = value << 8 | at[bytes];
  return value;
}

static int read_palette(bytes_t file, size_t header, layout_t* layout) {
  const size_t at = file_header + header;
  const size_t stated = number(file.data + 46, 4);
  layout->colours = stated != 0 ? stated : (size_t)1 << layout->bits;
  layout->palette = file.data + at;
  return at <= file.size && layout->colours <= (file.size - at) / 4;
}

static int read_masks(bytes_t file, unsigned long compression, layout_t* layout) {
  int i;
  for (i = 0; i < 3; ++i)
    layout->masks[i] = layout->bits == 16 ? 0x7c00ul >> 5 * i : 0xff0000ul >> 8 * i;
  if (compression != with_masks) return 1;
  if (file.size < masks_at + 12 || layout->bits == 24) return 0;
  for (i = 0; i < 3; ++i) layout->masks[i] = number(file.data + masks_at + 4 * i, 4);
  return 1;
}

static int read_layout(bytes_t file, layout_t* layout) {
  const unsigned char* const data = file.data;
  const size_t header = number(data + file_header, 4);
  const unsigned long compression = number(data + 30, 4);
  const unsigned long height = number(data + 22, 4);
  layout->width = number(data + 18, 4);
  layout->top_down = height > 0x7ffffffful;
  layout->height = layout->top_down ? 0xfffffffful - height + 1 : height;
  layout->bits = (unsigned)number(data + 28, 2);
  if (header < info_header || header > file.size) return 0;
  if (layout->width > 0x7fff || layout->height > 0x7fff) return 0;
  layout->stride = (layout->width * layout->bits + 31) / 32 * 4;
  switch (layout->bits) {
    case 1:
    case 4:
    case 8:
      return compression == plain && read_palette(file, header, layout);
    case 16:
    case 24:
    case 32:
      return (compression == plain || compression == with_masks) &&
             read_masks(file, compression, layout);
    default:
      return 0;
  }
}

/* The part of a pixel that a mask selects, as a byte. */
static unsigned char masked(unsigned long pixel, unsigned long mask) {
  if (mask == 0) return 0;
  while ((mask & 1) == 0) {
    mask >>= 1;
    pixel >>= 1;
  }
  return (unsigned char)((unsigned long long)(pixel & mask) * 255 / mask);
}

static int decode_pixel(const layout_t* layout, const unsigned char* row, size_t x,
                        unsigned char* rgb) {
  const unsigned bits = layout->bits;
  const unsigned char* const at = row + x * bits / 8;
  int i;
  if (bits > 8) {
    const unsigned long pixel = number(at, (int)bits / 8);
    for (i = 0; i < 3; ++i) rgb[i] = masked(pixel, layout->masks[i]);
  } else {
    const size_t shift = 8 - bits - x * bits % 8;
    const size_t index = (size_t)*at >> shift & (((size_t)1 << bits) - 1);
    if (index >= layout->colours) return 0;
    for (i = 0; i < 3; ++i) rgb[i] = layout->palette[4 * index + 2 - (size_t)i];
  }
  return 1;
}

int decode_picture(bytes_t file, img_picture_t* picture) {
  layout_t layout = {0};
  size_t pixels, x, y;
  if (file.size < masks_at || file.data[0] != 'B' || file.data[1] != 'M') return 0;
  if (!read_layout(file, &layout)) return 0;
  pixels = number(file.data + 10, 4);
  if (pixels > file.size || layout.stride * layout.height > file.size - pixels) return 0;
  if (!make_pixels(picture, layout.width, layout.height)) return 0;
  for (y = 0; y < layout.height; ++y) {
    const size_t line = layout.top_down ? y : layout.height - 1 - y;
    for (x = 0; x < layout.width; ++x)
      if (!decode_pixel(&layout, file.data + pixels + line * layout.stride, x,
                        picture->rgb + (y * layout.width + x) * 3))
        return 0;
  }
  return 1;
}
