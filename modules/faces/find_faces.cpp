// The face detector: OpenCV's cascade classifier behind one function. It runs in a process of its
// own, so it may take its time and its memory, and may fail.
#include <algorithm>
#include <opencv2/core.hpp>
#include <opencv2/imgproc.hpp>
#include <opencv2/objdetect.hpp>

#include "processing/faces/face_module.h"

namespace {

constexpr double kStep = 1.1;    // from one size of the search window to the next
constexpr int kNeighbors = 3;  // overlapping hits that make a face

}  // namespace

extern "C" __attribute__((visibility("default"))) int32_t FotomillFindFacesOf(
    const uint8_t* gray, int32_t width, int32_t height, ptrdiff_t stride, const char* cascade,
    int32_t smallest, FotomillFace* faces, int32_t most) {
  try {
    cv::setNumThreads(1);
    cv::CascadeClassifier classifier;
    if (!classifier.load(cascade)) return kFotomillNoCascade;
    const cv::Mat picture(height, width, CV_8UC1, const_cast<uint8_t*>(gray),
                          static_cast<size_t>(stride));
    cv::Mat even;
    cv::equalizeHist(picture, even);
    std::vector<cv::Rect> found;
    classifier.detectMultiScale(even, found, kStep, kNeighbors, 0, cv::Size(smallest, smallest));
    const auto count = std::min<size_t>(found.size(), static_cast<size_t>(most));
    for (size_t i = 0; i < count; ++i)
      faces[i] = {found[i].x, found[i].y, found[i].width, found[i].height};
    return static_cast<int32_t>(count);
  } catch (const cv::Exception&) {
    return kFotomillNoCascade;
  }
}
