// The EXIF orientation of a photo, in a file of its own: the decoder threads
// need it, and nothing else of the utilities.
#include <libexif/exif-data.h>
#include <libexif/exif-loader.h>

#include "common/CLyLog.h"
#include "common/CLyUtil.h"

namespace {

// The EXIF data of a file as it is stored. Loading through
// exif_data_new_from_file would "fix" the data to the standard first, which
// drops an orientation kept only in IFD 1 (and invents entries that are not
// in the file). nullptr when the file has no EXIF data.
ExifData* loadExif(const char* path) {
  ExifLoader* loader = exif_loader_new();
  if (!loader) return nullptr;
  exif_loader_write_file(loader, path);
  const unsigned char* buffer = nullptr;
  unsigned int size = 0;
  exif_loader_get_buf(loader, &buffer, &size);
  ExifData* data = nullptr;
  if (buffer && size > 0) {
    data = exif_data_new();
    if (data) {
      exif_data_unset_option(data, EXIF_DATA_OPTION_FOLLOW_SPECIFICATION);
      exif_data_load_data(data, buffer, size);
    }
  }
  exif_loader_unref(loader);
  return data;
}

}  // namespace

int CLyUtil::getOrientation(const std::string& path) {
  if (path.empty()) return -1;
  ExifData* data = loadExif(path.c_str());
  if (!data) {
    LYLOG_E("exif_data_new failed");
    return -1;
  }
  static const ExifIfd kOrder[] = {EXIF_IFD_0, EXIF_IFD_1, EXIF_IFD_EXIF, EXIF_IFD_GPS,
                                   EXIF_IFD_INTEROPERABILITY};
  ExifEntry* entry = nullptr;
  for (ExifIfd ifd : kOrder) {
    if (!data->ifd[ifd]) continue;
    entry = exif_content_get_entry(data->ifd[ifd], EXIF_TAG_ORIENTATION);
    // A damaged entry may carry no value at all; look on.
    if (entry && entry->data && entry->size >= 2) break;
    entry = nullptr;
  }
  if (!entry) {
    LYLOG_E("get_entry failed");
    exif_data_unref(data);
    return -1;
  }
  int orientation = exif_get_short(entry->data, exif_data_get_byte_order(data));
  LYLOG_W("orien %d", orientation);
  exif_data_unref(data);
  return orientation;
}
