#include "ShellTestFiles.h"

#include <jpeglib.h>
#include <libexif/exif-data.h>

#include <cstdio>
#include <cstdlib>
#include <vector>

namespace pictavo::test {

namespace {

std::vector<unsigned char> exifBytes(ExifPlace place, uint16_t orientation, bool bigEndian) {
  std::vector<unsigned char> bytes;
  if (place == ExifPlace::NONE) return bytes;
  ExifData* data = exif_data_new();
  ExifByteOrder order = bigEndian ? EXIF_BYTE_ORDER_MOTOROLA : EXIF_BYTE_ORDER_INTEL;
  exif_data_set_byte_order(data, order);
  ExifEntry* entry = exif_entry_new();
  exif_content_add_entry(data->ifd[place == ExifPlace::IFD0 ? EXIF_IFD_0 : EXIF_IFD_1], entry);
  exif_entry_initialize(entry, EXIF_TAG_ORIENTATION);
  exif_set_short(entry->data, order, orientation);
  exif_entry_unref(entry);
  unsigned char* buffer = nullptr;
  unsigned int length = 0;
  exif_data_save_data(data, &buffer, &length);
  bytes.assign(buffer, buffer + length);
  free(buffer);
  exif_data_unref(data);
  return bytes;
}

bool writeJpegWithApp1(const std::string& path, const std::vector<unsigned char>& app1) {
  FILE* f = fopen(path.c_str(), "wb");
  if (!f) return false;
  jpeg_compress_struct cinfo;
  jpeg_error_mgr jerr;
  cinfo.err = jpeg_std_error(&jerr);
  jpeg_create_compress(&cinfo);
  jpeg_stdio_dest(&cinfo, f);
  cinfo.image_width = 8;
  cinfo.image_height = 6;
  cinfo.input_components = 3;
  cinfo.in_color_space = JCS_RGB;
  jpeg_set_defaults(&cinfo);
  jpeg_start_compress(&cinfo, TRUE);
  if (!app1.empty())
    jpeg_write_marker(&cinfo, JPEG_APP0 + 1, app1.data(), static_cast<unsigned>(app1.size()));
  std::vector<unsigned char> row(8 * 3, 128);
  while (cinfo.next_scanline < cinfo.image_height) {
    JSAMPROW rows[1] = {row.data()};
    jpeg_write_scanlines(&cinfo, rows, 1);
  }
  jpeg_finish_compress(&cinfo);
  jpeg_destroy_compress(&cinfo);
  fclose(f);
  return true;
}

}  // namespace

bool writeJpeg(const std::string& path, ExifPlace place, uint16_t orientation, bool bigEndian) {
  return writeJpegWithApp1(path, exifBytes(place, orientation, bigEndian));
}

bool writeJpegWithRawApp1(const std::string& path, const std::string& junk) {
  std::vector<unsigned char> app1 = {'E', 'x', 'i', 'f', 0, 0};
  app1.insert(app1.end(), junk.begin(), junk.end());
  return writeJpegWithApp1(path, app1);
}

ScopedEnv::ScopedEnv(const char* name, const char* value) : mName(name) {
  if (const char* old = getenv(name)) {
    mOld = old;
    mHad = true;
  }
  if (value)
    setenv(name, value, 1);
  else
    unsetenv(name);
}

ScopedEnv::~ScopedEnv() {
  if (mHad)
    setenv(mName.c_str(), mOld.c_str(), 1);
  else
    unsetenv(mName.c_str());
}

}  // namespace pictavo::test
