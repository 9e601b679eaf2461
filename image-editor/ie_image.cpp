#include "image-editor/ie_image.h"

#include <Ecore.h>
#include <Ecore_Evas.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "common/CLyLog.h"
#include "image-editor/IE_Engine.h"

namespace {

constexpr const char* kClassName = "collage-ie-mainimg";
constexpr const char* kKeyCanvas = "Ecore_Evas";
constexpr const char* kKeyWidth = "preload_object_width";
constexpr const char* kKeyHeight = "preload_object_height";
// The factor that marks the GIF and WBMP path, where no scale-down applies.
constexpr int kFactorAnimated = 5;

struct IeImageSmartData {
  Evas_Object* parent;
  Evas_Object* image;
  Evas_Object* preload;   // on its own buffer canvas while a preload runs or waits to be freed
  Ecore_Job* preloadJob;  // completes or frees the preload outside evas callbacks
  bool preloadDone;
  bool preloadStarting;  // setting up the preload: completion waits for the job
  bool loaded;
  int lastW, lastH;
  int shownW, shownH;
  ie_image_resized_cb resizedCb;
  void* resizedData;
};

IeImageSmartData* dataOf(Evas_Object* obj) {
  IeImageSmartData* sd = obj ? static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj)) : nullptr;
  if (!sd) LYLOG_E("Failed get data");
  return sd;
}

// Deletes the off-screen object and frees its canvas.
void freePreload(IeImageSmartData* sd) {
  if (sd->preloadJob) {
    ecore_job_del(sd->preloadJob);
    sd->preloadJob = nullptr;
  }
  if (!sd->preload) return;
  Ecore_Evas* ee = static_cast<Ecore_Evas*>(evas_object_data_get(sd->preload, kKeyCanvas));
  evas_object_del(sd->preload);
  sd->preload = nullptr;
  if (ee) ecore_evas_free(ee);
}

void releaseJob(void* data) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(data);
  sd->preloadJob = nullptr;
  freePreload(sd);
}

// Copies the off-screen canvas's rendered pixels into the visible image.
void completePreload(IeImageSmartData* sd) {
  if (!sd->preload || sd->preloadDone) return;
  sd->preloadDone = true;
  Evas_Object* po = sd->preload;
  Ecore_Evas* ee = static_cast<Ecore_Evas*>(evas_object_data_get(po, kKeyCanvas));
  const int w = (int)(intptr_t)evas_object_data_get(po, kKeyWidth);
  const int h = (int)(intptr_t)evas_object_data_get(po, kKeyHeight);
  if (ee && w > 0 && h > 0) {
    ecore_evas_manual_render(ee);
    const void* pixels = ecore_evas_buffer_pixels_get(ee);
    if (pixels) {
      evas_object_image_size_set(sd->image, w, h);
      evas_object_image_data_copy_set(sd->image, const_cast<void*>(pixels));
      evas_object_image_data_update_add(sd->image, 0, 0, w, h);
    } else {
      LYLOG_E("preloaded canvas has no pixels");
    }
  }
  evas_object_hide(po);
  evas_object_image_preload(po, EINA_TRUE);
  evas_object_image_file_set(po, nullptr, nullptr);
  LYLOG_D("preloaded width is %d , height is %d", w, h);
  // The canvas is freed from a job: this may run inside one of its callbacks.
  if (sd->preloadJob) ecore_job_del(sd->preloadJob);
  sd->preloadJob = ecore_job_add(releaseJob, sd);
}

void onPreloaded(void* data, Evas*, Evas_Object*, void*) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(data);
  // Pixels given as data count as preloaded at once, while being set; the
  // copy then waits for the job, so loading always finishes on a later pass
  // of the main loop.
  if (!sd->preloadStarting) completePreload(sd);
}

void preloadJob(void* data) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(data);
  sd->preloadJob = nullptr;
  completePreload(sd);
}

// Smart class callbacks.

void smartAdd(Evas_Object* obj) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(calloc(1, sizeof(IeImageSmartData)));
  if (!sd) {
    LYLOG_E("Failed to alloc memory");
    return;
  }
  sd->image = evas_object_image_filled_add(evas_object_evas_get(obj));
  evas_object_image_smooth_scale_set(sd->image, EINA_TRUE);
  evas_object_name_set(sd->image, "mImage");
  evas_object_smart_member_add(sd->image, obj);
  evas_object_smart_data_set(obj, sd);
}

void smartDel(Evas_Object* obj) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (!sd) return;
  if (sd->loaded) ie_image_file_unload(obj);
  freePreload(sd);
  if (sd->image) evas_object_del(sd->image);
  evas_object_smart_data_set(obj, nullptr);
  free(sd);
}

void smartMove(Evas_Object* obj, Evas_Coord x, Evas_Coord y) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (sd) evas_object_move(sd->image, x, y);
}

void smartResize(Evas_Object* obj, Evas_Coord w, Evas_Coord h) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (!sd) return;
  evas_object_resize(sd->image, w, h);
  if (w == sd->lastW && h == sd->lastH) return;
  sd->lastW = w;
  sd->lastH = h;
  evas_object_smart_changed(obj);
  if (sd->resizedCb) {
    LYLOG_D("Image object resized");
    sd->resizedCb(sd->resizedData, obj);
  }
}

void smartShow(Evas_Object* obj) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (sd) evas_object_show(sd->image);
}

void smartHide(Evas_Object* obj) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (sd) evas_object_hide(sd->image);
}

void smartClipSet(Evas_Object* obj, Evas_Object* clip) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (sd) evas_object_clip_set(sd->image, clip);
}

void smartClipUnset(Evas_Object* obj) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (sd) evas_object_clip_unset(sd->image);
}

void smartCalculate(Evas_Object* obj) {
  IeImageSmartData* sd = static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj));
  if (!sd) return;
  Evas_Coord x, y, w, h;
  evas_object_geometry_get(obj, &x, &y, &w, &h);
  evas_object_move(sd->image, x, y);
  evas_object_resize(sd->image, w, h);
}

Evas_Smart* smartClass() {
  static Evas_Smart* smart = nullptr;
  if (!smart) {
    static Evas_Smart_Class sc = EVAS_SMART_CLASS_INIT_NAME_VERSION(kClassName);
    sc.add = smartAdd;
    sc.del = smartDel;
    sc.move = smartMove;
    sc.resize = smartResize;
    sc.show = smartShow;
    sc.hide = smartHide;
    sc.clip_set = smartClipSet;
    sc.clip_unset = smartClipUnset;
    sc.calculate = smartCalculate;
    smart = evas_smart_class_new(&sc);
  }
  return smart;
}

bool isAnimatedFormat(const char* path) {
  return strstr(path, ".gif") || strstr(path, ".GIF") || strstr(path, ".wbmp") || strstr(path, ".WBMP");
}

// Scale-down factor from the source long side s and the fitted long side l.
int scaleFactor(long long s, long long l) {
  if (s <= 2 * l) return 1;
  if (s <= 3 * l) return 2;
  if (s <= 4 * l) return 3;
  return 4;
}

bool loadDirect(IeImageSmartData* sd, const void* pixels, int w, int h, int iw, int ih, int factor) {
  // The visible image is sized straight from the caller's pixels: they are
  // what the image would hold, so no full-size copy is made first.
  evas_object_image_load_orientation_set(sd->image, EINA_TRUE);
  evas_object_image_load_scale_down_set(sd->image, factor);
  LYLOG_D("loaded image width: %d, height: %d", w, h);
  IeImageInfo src{w, h, IE_FORMAT_ARGB8888, static_cast<unsigned char*>(const_cast<void*>(pixels))};
  IeImageInfo inter{iw, ih, IE_FORMAT_ARGB8888,
                    static_cast<unsigned char*>(calloc((size_t)iw * (size_t)ih, 4))};
  if (!inter.pbBuf) {
    LYLOG_E("inter.pbBuf is null ,Calloc failed");
    return false;
  }
  IEL_resize_image(&src, &inter);
  evas_object_image_size_set(sd->image, iw, ih);
  evas_object_image_data_copy_set(sd->image, inter.pbBuf);
  evas_object_image_data_update_add(sd->image, 0, 0, iw, ih);
  free(inter.pbBuf);
  sd->shownW = iw;
  sd->shownH = ih;
  return true;
}

bool loadByPreload(IeImageSmartData* sd, const void* pixels, int w, int h, int iw, int ih, int factor) {
  // The canvas is made at the size it renders at; the photo is scaled onto it.
  Ecore_Evas* ee = ecore_evas_buffer_new(iw, ih);
  if (!ee) {
    LYLOG_E("could not create the off-screen canvas %dx%d", iw, ih);
    return false;
  }
  sd->preloadStarting = true;
  Evas_Object* po = evas_object_image_filled_add(ecore_evas_get(ee));
  evas_object_image_load_orientation_set(po, EINA_TRUE);
  evas_object_data_set(po, kKeyCanvas, ee);
  evas_object_event_callback_add(po, EVAS_CALLBACK_IMAGE_PRELOADED, onPreloaded, sd);
  evas_object_image_smooth_scale_set(po, EINA_TRUE);
  evas_object_image_size_set(po, w, h);
  evas_object_image_data_copy_set(po, const_cast<void*>(pixels));
  const Evas_Load_Error err = evas_object_image_load_error_get(po);
  if (err != EVAS_LOAD_ERROR_NONE)
    LYLOG_E("could not load image. error string is \"%s\"\n", evas_load_error_str(err));
  evas_object_image_fill_set(po, 0, 0, iw, ih);
  evas_object_move(po, 0, 0);
  evas_object_resize(po, iw, ih);
  ecore_evas_resize(ee, iw, ih);
  if (factor != kFactorAnimated) evas_object_image_load_scale_down_set(po, factor);
  evas_object_data_set(po, kKeyWidth, (void*)(intptr_t)iw);
  evas_object_data_set(po, kKeyHeight, (void*)(intptr_t)ih);
  evas_object_show(po);
  sd->preload = po;
  sd->preloadDone = false;
  evas_object_image_preload(po, EINA_FALSE);
  sd->preloadStarting = false;
  // Evas may report no preload at all for pixels given as data: the job
  // finishes the copy on the next loop pass unless the callback came first.
  sd->preloadJob = ecore_job_add(preloadJob, sd);
  sd->shownW = iw;
  sd->shownH = ih;
  LYLOG_D("iw width: %d, height: %d, scale_factor: %d", iw, ih, factor);
  return true;
}

}  // namespace

Evas_Object* ie_image_create(Evas_Object* parent, bool withGestures) {
  if (!parent) {
    LYLOG_E("no parent");
    return nullptr;
  }
  if (withGestures) LYLOG_W("gestures are handled by the edit view; created without");
  Evas_Object* obj = evas_object_smart_add(evas_object_evas_get(parent), smartClass());
  IeImageSmartData* sd = obj ? static_cast<IeImageSmartData*>(evas_object_smart_data_get(obj)) : nullptr;
  if (!sd) {
    if (obj) evas_object_del(obj);
    return nullptr;
  }
  sd->parent = parent;
  evas_object_name_set(obj, "Image");
  return obj;
}

bool ie_image_file_load_copy(Evas_Object* obj, const char* path, const void* pixels, int w, int h, int sw,
                             int sh) {
  IeImageSmartData* sd = dataOf(obj);
  if (!sd) return false;
  if (!path || !pixels) {
    LYLOG_E("Invalid image");
    return false;
  }
  LYLOG_D("Source image width: %d, height: %d, Screen width: %d, height: %d", w, h, sw, sh);
  if (w <= 0 || h <= 0 || sw <= 0 || sh <= 0) {
    LYLOG_E("Invalid image");
    return false;
  }
  // A second load replaces the photo: the first one's pixels and any
  // off-screen preload go.
  if (sd->loaded || sd->preload) {
    ie_image_file_unload(obj);
    freePreload(sd);
  }
  const long long t = sw > sh ? sw : sh;
  int iw, ih;
  if (w > h) {
    iw = (int)t;
    ih = (int)((long long)h * t / w);
  } else {
    ih = (int)t;
    iw = (int)((long long)w * t / h);
  }
  if (iw < 1) iw = 1;
  if (ih < 1) ih = 1;
  LYLOG_D("fix size to screen iw: %d, ih: %d", iw, ih);

  bool ok;
  if ((long long)w * h <= (long long)sw * sh) {
    evas_object_image_load_orientation_set(sd->image, EINA_TRUE);
    evas_object_image_size_set(sd->image, w, h);
    evas_object_image_data_copy_set(sd->image, const_cast<void*>(pixels));
    evas_object_image_data_update_add(sd->image, 0, 0, w, h);
    sd->shownW = w;
    sd->shownH = h;
    LYLOG_D("under screen size image  width: %d, height: %d", w, h);
    ok = true;
  } else {
    const long long longSide = w > h ? w : h;
    const long long fitted = w > h ? iw : ih;
    const int factor = isAnimatedFormat(path) ? kFactorAnimated : scaleFactor(longSide, fitted);
    ok = factor >= 3 ? loadByPreload(sd, pixels, w, h, iw, ih, factor)
                     : loadDirect(sd, pixels, w, h, iw, ih, factor);
  }
  if (!ok) return false;
  sd->loaded = true;
  evas_object_smart_changed(obj);
  evas_object_show(obj);
  return true;
}

void ie_image_set_resized_callback(Evas_Object* obj, ie_image_resized_cb callback, void* data) {
  IeImageSmartData* sd = dataOf(obj);
  if (!sd) return;
  sd->resizedCb = callback;
  sd->resizedData = data;
}

Evas_Object* ie_image_internal_image_get(Evas_Object* obj) {
  IeImageSmartData* sd = dataOf(obj);
  return sd ? sd->image : nullptr;
}

void ie_image_geometry_get(Evas_Object* obj, int* x, int* y, int* w, int* h) {
  IeImageSmartData* sd = dataOf(obj);
  if (!sd) return;
  evas_object_geometry_get(sd->image, x, y, w, h);
}

void* ie_image_internal_buffer_get(Evas_Object* obj) {
  IeImageSmartData* sd = dataOf(obj);
  return sd ? evas_object_image_data_get(sd->image, EINA_TRUE) : nullptr;
}

void ie_image_file_unload(Evas_Object* obj) {
  IeImageSmartData* sd = dataOf(obj);
  if (!sd) return;
  // A 1 x 1 image frees the pixels evas held for the photo.
  evas_object_image_size_set(sd->image, 1, 1);
  sd->loaded = false;
  sd->shownW = 0;
  sd->shownH = 0;
  evas_object_hide(obj);
}

bool ie_image_is_loaded(Evas_Object* obj) {
  IeImageSmartData* sd = dataOf(obj);
  return sd && sd->loaded;
}

bool ie_image_preload_pending(Evas_Object* obj) {
  IeImageSmartData* sd = dataOf(obj);
  return sd && sd->preload && !sd->preloadDone;
}

void ie_image_shown_size_get(Evas_Object* obj, int* w, int* h) {
  IeImageSmartData* sd = dataOf(obj);
  if (w) *w = sd ? sd->shownW : 0;
  if (h) *h = sd ? sd->shownH : 0;
}
