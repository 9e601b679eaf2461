#include "model/CLyImageDecoderThread.h"

#include "codec/BitmapFactory.h"
#include "common/CLyAppData.h"
#include "common/CLyLog.h"
#include "common/CLyUtil.h"
#include "model/ILyMultiGridListener.h"

CLyImageDecoderThread::~CLyImageDecoderThread() {
  // Join here, while run() and the fields it reads still exist.
  join();
}

bool CLyImageDecoderThread::set(int index, const std::string& path, ILyMultiGridListener* listener) {
  mIndex = index;
  mPath = path;
  mListener = listener;
  return true;
}

void CLyImageDecoderThread::setMaxDecodingSize(float width, float height) {
  LYLOG_D("max size: %f %f", width, height);
  mMaxDecodingWidth = width;
  mMaxDecodingHeight = height;
}

void CLyImageDecoderThread::setCoverSize(float width, float height) {
  mCoverWidth = width > 0 ? width : 0.0f;
  mCoverHeight = height > 0 ? height : 0.0f;
}

void CLyImageDecoderThread::computeCoverTarget(int w, int h, int orientation, float coverW, float coverH,
                                               int* targetW, int* targetH) {
  if (w < 1 || h < 1 || coverW <= 0 || coverH <= 0) return;
  const bool turned = orientation == 6 || orientation == 8;
  // Only the 1/8, 1/4 and 1/2 scales: libjpeg-turbo has vector code for
  // their inverse DCTs, while 3/8, 5/8... run in plain C and cost more than
  // their fewer pixels save (9% more instructions for six 12 MP photos at
  // 3/8 than at 1/2).
  for (int m = 1; m < 8; m *= 2) {
    // libjpeg's scaled size: the image size times m / 8, rounded up.
    const int sw = (int)(((long long)w * m + 7) / 8), sh = (int)(((long long)h * m + 7) / 8);
    const int uw = turned ? sh : sw, uh = turned ? sw : sh;
    if (uw < coverW || uh < coverH) continue;
    if (sw < *targetW && sh < *targetH) {
      *targetW = sw;
      *targetH = sh;
    }
    return;
  }
}

int CLyImageDecoderThread::rotationForOrientation(int orientation) {
  switch (orientation) {
    case 3:
      return 2;
    case 6:
      return 1;
    case 8:
      return 3;
    default:
      return 0;
  }
}

void CLyImageDecoderThread::computeTarget(int w, int h, int orientation, float maxW, float maxH, int* targetW,
                                          int* targetH) {
  // A photo stored turned by a quarter is compared with the limits exchanged.
  float limitW = maxW, limitH = maxH;
  if (orientation == 6 || orientation == 8) {
    LYLOG_D("Image is rotated");
    limitW = maxH;
    limitH = maxW;
  }
  LYLOG_D("decodingMaxWidth / decodingMaxHeight : %.3f %.3f", limitW, limitH);
  const float sw = w > limitW ? limitW / w : 1.0f;
  const float sh = h > limitH ? limitH / h : 1.0f;
  LYLOG_D("widthScale / heightScale : %.3f %.3f", sw, sh);
  float tw = static_cast<float>(w), th = static_cast<float>(h);
  if (sw != 1.0f || sh != 1.0f) {
    const float s = sw < sh ? sw : sh;
    tw = w * s;
    th = h * s;
  }
  LYLOG_D("orgWidth / orgHeight : %d %d <-->  width / hight : %.3f %.3f", w, h, tw, th);
  // Truncated, but a product that lands a hair below a whole number (719.9999
  // for 720) keeps that number, and a sliver of a picture keeps one pixel.
  const int iw = static_cast<int>(tw + 0.001f), ih = static_cast<int>(th + 0.001f);
  *targetW = iw < 1 ? 1 : iw;
  *targetH = ih < 1 ? 1 : ih;
}

void CLyImageDecoderThread::run() {
  LYLOG_D("Run start[%d]", mIndex);
  if (!mListener) {
    LYLOG_E("Invalid listener");
    return;
  }
  DecodeOptions header;
  const int parsed = BitmapFactory::parseImage(mPath, header);
  const bool supported =
      BitmapFactory::isSupportedType(header.imageType) || header.imageType == IMAGE_TYPE_PNG;
  LYLOG_D("bSupported = %d", supported);
  if (parsed != 1 || !supported) {
    mListener->onInvalidateMultiGrid(mIndex, nullptr);
    LYLOG_D("Run end");
    return;
  }

  const int orientation = CLyUtil::getOrientation(mPath);
  int width = 0, height = 0;
  computeTarget(header.outWidth, header.outHeight, orientation, mMaxDecodingWidth, mMaxDecodingHeight, &width,
                &height);
  if (header.imageType == IMAGE_TYPE_JPEG)
    computeCoverTarget(header.outWidth, header.outHeight, orientation, mCoverWidth, mCoverHeight, &width,
                       &height);

  Bitmap* bitmap = nullptr;
  if (header.imageType == IMAGE_TYPE_PNG) {
    // The PNG path is serialised across all decoder threads.
    CLyAppData::lock();
    DecodeOptions options;
    options.colorFormat = BITMAP_FORMAT_BGRA;
    int result = BitmapFactory::initPNGFile(options, mPath);
    LYLOG_D("nResult = %d", result);
    if (result == 1) bitmap = BitmapFactory::createBitmap(width, height, BITMAP_FORMAT_BGRA);
    if (!bitmap) {
      LYLOG_E("mDecodeBitmap is NULL!");
    } else {
      result = BitmapFactory::decodePNG(options, *bitmap, width, height);
      if (result != 1) {
        LYLOG_E("nResult = %d", result);
        delete bitmap;
        bitmap = nullptr;
      }
    }
    CLyAppData::unlock();
  } else {
    DecodeOptions options;
    options.colorFormat = BITMAP_FORMAT_BGRA;
    bitmap = BitmapFactory::decodeFile(mPath, options, width, height, 0);
  }

  if (bitmap) {
    LYLOG_D("mPixel : %p", static_cast<void*>(bitmap->getPixels()));
    const int rotation = rotationForOrientation(orientation);
    // When the turn cannot get its buffer the photo goes on unturned.
    if (rotation != 0) BitmapFactory::rotate(*bitmap, rotation);
  }
  mListener->onInvalidateMultiGrid(mIndex, bitmap);
  LYLOG_D("Run end");
}
