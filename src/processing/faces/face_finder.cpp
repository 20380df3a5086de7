#include "processing/faces/face_finder.h"

#include <algorithm>
#include <cmath>
#include <cstring>
#include <optional>

#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/shared_library.h"
#include "processing/faces/face_module.h"
#include "processing/geometry/cut.h"
#include "processing/geometry/scale.h"
#include "processing/pixel_rows.h"

namespace fotomill {

namespace {

constexpr int32_t kWindow = 24;         // minimum face size of the classifiers, pixels
constexpr int32_t kLongestEdge = 1600;  // of the picture to search
constexpr int32_t kMostFaces = 1000;
constexpr unsigned kSeconds = 60;

// Modules are next to the program in a build tree, or in the installation prefix.
std::string ModulePath() {
  const std::string program = platform::ProgramFolder();
  const std::string name = std::string("fotomill-faces") + platform::kModuleExtension;
  for (const std::string& folder :
       {program, platform::JoinFolder(platform::FolderOf(program), "lib/fotomill")}) {
    std::string path = platform::JoinFolder(folder, name);
    if (platform::IsRegularFile(path)) return path;
  }
  return {};
}

// Empty if there is no such classifier.
std::string CascadePath(const std::string& cascade) {
  if (platform::IsRegularFile(cascade) && cascade.find('/') != std::string::npos)
    return platform::AbsolutePath(cascade);
  constexpr const char* kFolders[] = {"/usr/share/opencv4/haarcascades",
                                      "/usr/share/opencv/haarcascades",
                                      "/usr/local/share/opencv4/haarcascades"};
  for (const char* folder : kFolders) {
    std::string path = platform::JoinFolder(folder, cascade);
    if (!cascade.empty() && platform::IsRegularFile(path)) return path;
  }
  return {};
}

// The request to the worker process, followed by the paths of module and classifier, each
// NUL-terminated. The input is the picture's gray samples, row by row from the top.
struct Request {
  int32_t width, height, smallest;
};

// The reply: the number of faces, and the faces.
struct Reply {
  int32_t count;
  FotomillFace faces[kMostFaces];
};

// The picture to search, and its scale relative to the original.
struct Searched {
  std::vector<uint8_t> gray;
  int32_t width = 0, height = 0, smallest = kWindow;
  double scale = 1;
};

// The smallest relevant face is not scaled below the classifiers' minimum size.
double ScaleFor(Size size, int32_t smallestPercent) {
  const double smallest = std::min(size.width, size.height) * smallestPercent / 100.0;
  const double byFace = smallest > kWindow ? kWindow / smallest : 1;
  const double bySize = static_cast<double>(kLongestEdge) / std::max(size.width, size.height);
  return std::min({1.0, byFace, bySize});
}

Status Prepare(const PackedImage& image, const FaceOptions& options, Searched& searched) {
  const Size size{image.Width(), image.Height()};
  searched.scale = ScaleFor(size, options.smallestPercent);
  searched.width = std::max(1, static_cast<int32_t>(std::lround(size.width * searched.scale)));
  searched.height = std::max(1, static_cast<int32_t>(std::lround(size.height * searched.scale)));
  const double smallest =
      std::min(size.width, size.height) * options.smallestPercent / 100.0 * searched.scale;
  searched.smallest = std::max(kWindow, static_cast<int32_t>(std::lround(smallest)));
  PackedImage scaled, noAlpha;
  RETURN_IF_BAD(ScaleFiltered(image, {}, Size{searched.width, searched.height}, ScaleFilter::Box,
                              scaled, noAlpha));
  const auto width = static_cast<size_t>(searched.width);
  searched.gray.resize(width * static_cast<size_t>(searched.height));
  for (int32_t y = 0; y < searched.height; ++y) {
    const uint8_t* bgr = scaled.Row(y).data();
    uint8_t* gray = searched.gray.data() + static_cast<size_t>(y) * width;
    // Rec. ITU-R BT.601 in 256ths.
    for (size_t x = 0; x < width; ++x, bgr += 3)
      gray[x] = static_cast<uint8_t>((29 * bgr[0] + 150 * bgr[1] + 77 * bgr[2] + 128) >> 8);
  }
  return Status::Ok;
}

Rectangle InPicture(const FotomillFace& face, double scale, int32_t width, int32_t height) {
  const auto at = [&](int32_t value, int32_t most) {
    return static_cast<int32_t>(
        std::clamp(std::lround(value / scale), 0L, static_cast<long>(most)));
  };
  const int32_t left = at(face.x, width), top = at(face.y, height);
  return {left, top, at(face.x + face.width, width) - left, at(face.y + face.height, height) - top};
}

}  // namespace

bool CanFindFaces(const FaceOptions& options) {
  return !ModulePath().empty() && !CascadePath(options.cascade).empty();
}

Status FindFaces(const PackedImage& image, const FaceOptions& options,
                 std::vector<Rectangle>& faces, const std::function<bool()>& goesOn) {
  faces.clear();
  if (image.Empty()) return Status::EmptyImage;
  const std::string module = ModulePath(), cascade = CascadePath(options.cascade);
  if (module.empty() || cascade.empty()) return Status::FeatureDisabled;
  Searched searched;
  RETURN_IF_BAD(Prepare(image, options, searched));
  // Classifiers cannot find faces smaller than their window.
  if (std::min(searched.width, searched.height) < kWindow) return Status::Ok;

  const Request head = {searched.width, searched.height, searched.smallest};
  std::vector<uint8_t> request(sizeof head);
  std::memcpy(request.data(), &head, sizeof head);
  for (const std::string& path : {module, cascade}) {
    request.insert(request.end(), path.begin(), path.end());
    request.push_back(0);
  }
  if (request.size() > platform::kMostRequest) return Status::FeatureDisabled;
  platform::SharedBlock block;
  if (!block.Allocate(sizeof(Reply))) return Status::MemoryAllocationError;
  const platform::ApartResult result = platform::RunApart({.task = kFacesTask,
                                                           .request = request,
                                                           .input = searched.gray,
                                                           .reply = block,
                                                           .seconds = kSeconds,
                                                           .goesOn = goesOn},
                                                          [](int32_t) {});
  if (result == platform::ApartResult::Stopped) return Status::FunctionCancelled;
  if (result == platform::ApartResult::NotStarted) return Status::MemoryAllocationError;
  if (result != platform::ApartResult::Done) return Status::FeatureDisabled;
  Reply reply;
  std::memcpy(&reply, block.Bytes().data(), sizeof reply);
  for (int32_t i = 0; i < std::clamp(reply.count, 0, kMostFaces); ++i) {
    const Rectangle face = InPicture(reply.faces[i], searched.scale, image.Width(), image.Height());
    if (face.width > 0 && face.height > 0) faces.push_back(face);
  }
  std::ranges::stable_sort(faces, std::greater(), &Rectangle::width);
  return Status::Ok;
}

Rectangle AroundFaces(const std::vector<Rectangle>& faces, int32_t width, int32_t height) {
  int32_t left = width, top = height, right = 0, bottom = 0;
  for (const Rectangle& face : faces) {
    const int32_t side = face.width * 2 / 5, above = face.height / 2;
    left = std::min(left, face.x - side);
    right = std::max(right, face.x + face.width + side);
    top = std::min(top, face.y - above);
    bottom = std::max(bottom, face.y + face.height + side);
  }
  left = std::max(left, 0);
  top = std::max(top, 0);
  return {left, top, std::min(right, width) - left, std::min(bottom, height) - top};
}

Status FrameOnFaces(PictureRecord& picture, const FaceOptions& options, bool all,
                    const std::function<bool()>& goesOn) {
  std::vector<Rectangle> faces;
  const Status status = FindFaces(picture.image, options, faces, goesOn);
  if (status == Status::FunctionCancelled) return status;
  if (status != Status::Ok || faces.empty()) return Status::Ok;
  if (!all) faces.resize(1);
  return CutPicture(picture, AroundFaces(faces, picture.image.Width(), picture.image.Height()));
}

bool FindFacesApart(const platform::ApartCall& call) {
  Request request;
  if (call.request.size() < sizeof request || call.request.back() != 0) return false;
  std::memcpy(&request, call.request.data(), sizeof request);
  if (request.width < 1 || request.height < 1 || call.reply.size() != sizeof(Reply) ||
      call.input.size() != static_cast<size_t>(request.width) * static_cast<size_t>(request.height))
    return false;
  const char* const texts = reinterpret_cast<const char*>(call.request.data()) + sizeof request;
  const std::string module = texts, cascade = texts + module.size() + 1;
  platform::SharedLibrary library;
  if (!library.Load(module)) return false;
  const auto find = library.FunctionNamed<FotomillFindFaces>(kFotomillFindFaces);
  Reply reply = {};
  if (find != nullptr)
    reply.count = find(call.input.data(), request.width, request.height, request.width,
                       cascade.c_str(), request.smallest, reply.faces, kMostFaces);
  // Never unloaded: the library's threads and memory end with the process.
  static std::vector<platform::SharedLibrary> kept;
  kept.push_back(std::move(library));
  if (find == nullptr || reply.count < 0) return false;
  std::memcpy(call.reply.data(), &reply, sizeof reply);
  return true;
}

}  // namespace fotomill
