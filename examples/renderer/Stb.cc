// Stb.cc: stb's functions for PNG files, compiled as they come. (The ending keeps the linter, which reads *.cpp, to our own
// code.)

#define STBI_ONLY_PNG
#define STBI_NO_STDIO
#define STB_IMAGE_IMPLEMENTATION
#define STBI_WRITE_NO_STDIO
#define STB_IMAGE_WRITE_IMPLEMENTATION
#include <stb_image.h>
#include <stb_image_write.h>
