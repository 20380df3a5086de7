#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstring>
#include <vector>

#include "operations/area.h"
#include "operations/operations.h"
#include "processing/faces/face_finder.h"
#include "processing/filters/box_blur.h"
#include "processing/filters/convolve.h"
#include "processing/filters/gaussian.h"
#include "processing/filters/mosaic.h"
#include "processing/filters/motion_blur.h"
#include "processing/filters/rank.h"
#include "processing/filters/surface_blur.h"

// Filters: each pixel depends on its neighbors.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr Parameter kSigma = {.name = "sigma",
                              .kind = kNumber,
                              .unit = "px",
                              .preset = "1",
                              .least = 0.1,
                              .most = 1000,
                              .label = "Sigma",
                              .help = "Standard deviation of the Gaussian."};
constexpr Parameter kBlur[] = {kSigma};
constexpr Parameter kUnsharp[] = {
    kSigma,
    {.name = "amount", .kind = kNumber, .preset = "1", .least = 0, .most = 10, .label = "Amount",
     .help = "How much of the difference from the blurred picture is added; 1 is 100 %."},
    {.name = "threshold", .kind = kNumber, .unit = "levels", .preset = "0", .least = 0, .most = 255, .label = "Threshold",
     .help = "Smaller differences are left unchanged."},
};

GaussianPlace PlaceOf(const OperationContext& context) { return {context.left, context.top}; }
int32_t Reach(const Arguments& arguments) { return GaussianReach(arguments.Number("sigma")); }

Status Blur(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return BlurPicture(picture, arguments.Number("sigma"), PlaceOf(context), context.work);
}
Status Sharpen(PictureRecord& picture, const Arguments& arguments,
               const OperationContext& context) {
  return UnsharpPicture(picture, arguments.Number("sigma"), 1, 0, PlaceOf(context), context.work);
}
Status Unsharp(PictureRecord& picture, const Arguments& arguments,
               const OperationContext& context) {
  return UnsharpPicture(picture, arguments.Number("sigma"), arguments.Number("amount"),
                        arguments.Number("threshold"), PlaceOf(context), context.work);
}

constexpr Parameter kRadius = {
    .name = "radius",
    .kind = kInteger,
    .unit = "px",
    .preset = "1",
    .least = 0,
    .most = kMostRankRadius,
    .label = "Radius",
    .help = "The square has 2 x radius + 1 pixels on each side."};
constexpr Parameter kWindow[] = {kRadius};
static_assert(kMostBoxRadius >= kMostRankRadius);

int32_t Radius(const Arguments& arguments) { return arguments.Integer("radius"); }

Status BoxBlur(PictureRecord& picture, const Arguments& arguments,
               const OperationContext& context) {
  return BoxBlurPicture(picture, Radius(arguments), context.work);
}
template <Rank rank>
Status ApplyRank(PictureRecord& picture, const Arguments& arguments,
                 const OperationContext& context) {
  return RankPicture(picture, rank, Radius(arguments), context.work);
}

constexpr Parameter kMotion[] = {
    {.name = "length", .kind = kNumber, .unit = "px", .preset = "10", .least = 1, .most = 1000, .label = "Length", .help = "Distance of the motion."},
    {.name = "angle", .kind = kAngle, .unit = "degrees", .preset = "0", .least = -360, .most = 360, .label = "Angle",
     .help = "The direction; 0 is to the right."},
};

Status MotionBlur(PictureRecord& picture, const Arguments& arguments,
                  const OperationContext& context) {
  return MotionBlurPicture(picture, arguments.Number("length"), arguments.Number("angle"),
                           context.work);
}
int32_t ReachOfMotion(const Arguments& arguments) {
  return MotionReach(arguments.Number("length"));
}

constexpr Parameter kRadial[] = {
    {.name = "kind", .kind = kChoice, .preset = "spin", .choices = "spin|zoom", .label = "Kind",
     .help = "spin blurs around the center, zoom away from it."},
    {.name = "amount", .kind = kNumber, .preset = "10", .least = 0, .most = 100, .label = "Amount",
     .help = "Degrees of a spin, percent of a zoom."},
    {.name = "center", .kind = kPoint, .unit = "px", .preset = "50%,50%", .label = "Center", .help = "Point that stays sharp."},
};

Status RadialBlur(PictureRecord& picture, const Arguments& arguments,
                  const OperationContext& context) {
  const AreaPoint center = PointOf(
      arguments.Of("center"), {picture.image.Width(), picture.image.Height()}, picture.metadata);
  return RadialBlurPicture(picture, arguments.Choice<RadialKind>("kind"),
                           arguments.Number("amount"), center.x, center.y, context.work);
}

constexpr Parameter kDespeckle[] = {
    {.name = "radius", .kind = kInteger, .unit = "px", .preset = "1", .least = 1, .most = kMostRankRadius, .label = "Radius",
     .help = "Largest size of a speck."},
    {.name = "threshold", .kind = kInteger, .unit = "levels", .preset = "20", .least = 0, .most = 255, .label = "Threshold",
     .help = "How much a speck must differ from its surroundings."},
};

Status Despeckle(PictureRecord& picture, const Arguments& arguments,
                 const OperationContext& context) {
  return DespecklePicture(picture, Radius(arguments), arguments.Integer("threshold"), context.work);
}

constexpr Parameter kSurface[] = {
    {.name = "radius", .kind = kInteger, .unit = "px", .preset = "3", .least = 1, .most = kMostSurfaceRadius, .label = "Radius",
     .help = "The square has 2 x radius + 1 pixels on each side."},
    {.name = "threshold", .kind = kInteger, .unit = "levels", .preset = "20", .least = 0, .most = 255, .label = "Threshold",
     .help = "Pixels that differ more are ignored."},
};

Status SurfaceBlur(PictureRecord& picture, const Arguments& arguments,
                   const OperationContext& context) {
  return SurfaceBlurPicture(picture, Radius(arguments), arguments.Integer("threshold"),
                            context.work);
}

constexpr Parameter kOil[] = {
    {.name = "radius", .kind = kInteger, .unit = "px", .preset = "4", .least = 1, .most = kMostOilRadius, .label = "Radius",
     .help = "The size of the brush."},
    {.name = "levels", .kind = kInteger, .preset = "32", .least = 2, .most = kMostOilLevels, .label = "Levels",
     .help = "Number of shades that are distinguished."},
};

Status Oil(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return OilPicture(picture, Radius(arguments), arguments.Integer("levels"), context.work);
}

constexpr Parameter kEdges[] = {
    {.name = "amount", .kind = kNumber, .preset = "1", .least = 0, .most = 100, .label = "Amount", .help = "How bright edges become."},
};

Status Edges(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return FindPictureEdges(picture, arguments.Number("amount"), context.work);
}

constexpr Parameter kEmboss[] = {
    {.name = "angle", .kind = kAngle, .unit = "degrees", .preset = "315", .least = -360, .most = 360, .label = "Light",
     .help = "Where the light comes from; 0 is from the top."},
    {.name = "depth", .kind = kNumber, .preset = "2", .least = 0, .most = 100, .label = "Depth", .help = "How strong the relief is."},
};

Status Emboss(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return EmbossPicture(picture, arguments.Number("angle"), arguments.Number("depth"), context.work);
}
int32_t ReachOfGradient(const Arguments&) { return 1; }

constexpr Parameter kKernel[] = {
    {.name = "weights",
     .kind = kText,
     .most = 4000,
     .label = "Weights",
     .help = "9, 25, 49 or 81 numbers, row by row, separated by spaces or commas."},
    {.name = "divisor",
     .kind = kNumber,
     .preset = "",
     .least = -1e6,
     .most = 1e6,
     .label = "Divisor",
     .help =
         "The sum is divided by this (default: the sum of the weights, or 1 if that is 0)."},
    {.name = "bias",
     .kind = kNumber,
     .unit = "levels",
     .preset = "0",
     .least = -255,
     .most = 255,
     .label = "Bias",
     .help = "Added to the result."},
};

// Parses numbers separated by blanks or commas; empty if invalid.
std::vector<double> NumbersOf(const std::string& text) {
  std::vector<double> numbers;
  const char *at = text.data(), *end = at + text.size();
  while (at < end) {
    if (std::strchr(" ,\t\n", *at) != nullptr) {
      ++at;
      continue;
    }
    double number = 0;
    const auto [behind, error] = std::from_chars(at, end, number);
    if (error != std::errc() || !(std::abs(number) <= 1e6)) return {};
    numbers.push_back(number);
    at = behind;
  }
  return numbers;
}

ArgumentProblem CheckKernel(const Arguments& arguments) {
  const size_t count = NumbersOf(arguments.Text("weights")).size();
  if (count != 9 && count != 25 && count != 49 && count != 81)
    return {"weights", TrRecorded("must be 9, 25, 49 or 81 numbers")};
  if (arguments.Has("divisor") && arguments.Number("divisor") == 0)
    return {"divisor", TrRecorded("must not be 0")};
  return {};
}

Status Kernel(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const std::vector<double> weights = NumbersOf(arguments.Text("weights"));
  double divisor = 0;
  for (const double weight : weights) divisor += weight;
  if (arguments.Has("divisor")) divisor = arguments.Number("divisor");
  return ConvolvePicture(picture, weights, divisor == 0 ? 1 : divisor, arguments.Number("bias"),
                         context.work);
}
int32_t ReachOfKernel(const Arguments& arguments) {
  return KernelReach(NumbersOf(arguments.Text("weights")).size());
}

// Converts a rectangle of the whole picture to coordinates of the computed part; without one, the
// whole part.
Rectangle AreaOfPart(const PictureRecord& picture, const Value& area,
                     const OperationContext& context) {
  const Size own{picture.image.Width(), picture.image.Height()},
      whole = context.whole.width > 0 ? context.whole : own;
  Rectangle seen = area.given ? AreaOf(area, whole, picture.metadata)
                              : Rectangle{0, 0, whole.width, whole.height};
  seen.x -= context.left;
  seen.y -= context.top;
  return seen;
}

constexpr Parameter kMosaic[] = {
    {.name = "size", .kind = kInteger, .unit = "px", .preset = "10", .least = 1, .most = 10000, .label = "Size", .help = "Edge length of a square."},
    {.name = "area", .kind = kRectangle, .unit = "px", .preset = "", .label = "Area", .help = "WxH+X+Y (default: the whole picture)."},
};

Status Mosaic(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return MosaicPicture(picture, AreaOfPart(picture, arguments.Of("area"), context),
                       arguments.Integer("size"), context.work);
}
int32_t ReachOfMosaic(const Arguments& arguments) { return arguments.Integer("size"); }

constexpr Parameter kRedEye[] = {
    {.name = "area", .kind = kRectangle, .unit = "px", .preset = "", .label = "Area", .help = "WxH+X+Y around the eyes (default with faces: the whole picture)."},
    {.name = "sensitivity", .kind = kPercent, .unit = "%", .preset = "50", .least = 0, .most = 100, .label = "Sensitivity",
     .help = "Higher values also correct weaker red."},
    {.name = "faces", .kind = kFlag, .preset = "no", .label = "In faces", .help = "Only corrects faces within the area."},
};

Status RedEye(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  const Rectangle area = arguments.Has("area")
                             ? AreaOfPart(picture, arguments.Of("area"), context)
                             : Rectangle{0, 0, picture.image.Width(), picture.image.Height()};
  const double ratio = 2.6 - arguments.Number("sensitivity") / 50;
  if (!arguments.Flag("faces")) return RemoveRedEye(picture, area, ratio);
  std::vector<Rectangle> faces;
  RETURN_IF_BAD(FindFaces(picture.image, context.faces, faces, context.work.goesOn));
  constexpr double kBeyondSkin = 0.6;  // stronger red needed to tell pupils from skin around them
  for (const Rectangle& face : faces)
    RETURN_IF_BAD(RemoveRedEyesOfFace(picture, face, area, ratio + kBeyondSkin));
  return Status::Ok;
}
ArgumentProblem CheckRedEye(const Arguments& arguments) {
  if (arguments.Has("area") || arguments.Flag("faces")) return {};
  return {"area", TrRecorded("must be given, or faces")};
}
// Faces are detected in the whole picture.
int32_t ReachOfRedEye(const Arguments& arguments) { return arguments.Flag("faces") ? 1 << 24 : 0; }

constexpr Operation kOperations[] = {
    {.name = "blur",
     .family = Family::Filter,
     .label = "Gaussian blur",
     .help = "Blurs a picture evenly.",
     .example = "blur 2",
     .parameters = kBlur,
     .works = Works::Neighborhood,
     .apply = Blur,
     .reach = Reach},
    {.name = "sharpen",
     .family = Family::Filter,
     .label = "Sharpen",
     .help = "Makes edges stand out.",
     .example = "sharpen 0.6",
     .parameters = kBlur,
     .works = Works::Neighborhood,
     .apply = Sharpen,
     .reach = Reach},
    {.name = "unsharp",
     .family = Family::Filter,
     .label = "Unsharp mask",
     .help = "Sharpens by adding the difference to a blurred copy.",
     .example = "unsharp 1.5 0.8 threshold=3",
     .parameters = kUnsharp,
     .works = Works::Neighborhood,
     .apply = Unsharp,
     .reach = Reach},
    {.name = "box-blur",
     .family = Family::Filter,
     .label = "Box blur",
     .help = "Replaces each pixel with the mean of a square around it.",
     .example = "box-blur 3",
     .parameters = kWindow,
     .works = Works::Neighborhood,
     .apply = BoxBlur,
     .reach = Radius},
    {.name = "median",
     .family = Family::Filter,
     .label = "Median",
     .help =
         "Replaces each pixel with the median of a square around it: removes specks and keeps edges.",
     .example = "median 2",
     .parameters = kWindow,
     .works = Works::Neighborhood,
     .apply = ApplyRank<Rank::Median>,
     .reach = Radius},
    {.name = "minimum",
     .family = Family::Filter,
     .label = "Minimum",
     .help = "Replaces each pixel with the darkest level in a square around it: dark areas grow.",
     .example = "minimum 2",
     .parameters = kWindow,
     .works = Works::Neighborhood,
     .apply = ApplyRank<Rank::Minimum>,
     .reach = Radius},
    {.name = "maximum",
     .family = Family::Filter,
     .label = "Maximum",
     .help = "Replaces each pixel with the brightest level in a square around it: bright areas grow.",
     .example = "maximum 2",
     .parameters = kWindow,
     .works = Works::Neighborhood,
     .apply = ApplyRank<Rank::Maximum>,
     .reach = Radius},
    {.name = "motion-blur",
     .family = Family::Filter,
     .label = "Motion blur",
     .help = "Blurs along a line.",
     .example = "motion-blur 12 30",
     .parameters = kMotion,
     .works = Works::Neighborhood,
     .apply = MotionBlur,
     .reach = ReachOfMotion},
    {.name = "radial-blur",
     .family = Family::Filter,
     .label = "Radial blur",
     .help = "Blurs in circles around a center, or away from it.",
     .example = "radial-blur zoom 20",
     .parameters = kRadial,
     .works = Works::WholePicture,
     .apply = RadialBlur},
    {.name = "despeckle",
     .family = Family::Filter,
     .label = "Despeckle",
     .help = "Removes specks and leaves the rest unchanged.",
     .example = "despeckle threshold=30",
     .parameters = kDespeckle,
     .works = Works::Neighborhood,
     .apply = Despeckle,
     .reach = Radius},
    {.name = "surface-blur",
     .family = Family::Filter,
     .label = "Surface blur",
     .help = "Smooths surfaces and keeps edges.",
     .example = "surface-blur 4 25",
     .parameters = kSurface,
     .works = Works::Neighborhood,
     .apply = SurfaceBlur,
     .reach = Radius},
    {.name = "edges",
     .family = Family::Filter,
     .label = "Edges",
     .help = "Shows edges bright on black.",
     .example = "edges",
     .parameters = kEdges,
     .works = Works::Neighborhood,
     .apply = Edges,
     .reach = ReachOfGradient},
    {.name = "emboss",
     .family = Family::Filter,
     .label = "Emboss",
     .help = "Turns a picture into a gray relief.",
     .example = "emboss 315 3",
     .parameters = kEmboss,
     .works = Works::Neighborhood,
     .apply = Emboss,
     .reach = ReachOfGradient},
    {.name = "oil",
     .family = Family::Filter,
     .label = "Oil painting",
     .help = "Paints the picture in strokes of one color.",
     .example = "oil 3",
     .parameters = kOil,
     .works = Works::Neighborhood,
     .apply = Oil,
     .reach = Radius},
    {.name = "mosaic",
     .family = Family::Filter,
     .label = "Mosaic",
     .help = "Turns the area into squares of one color, for example to hide a face or a license plate.",
     .example = "mosaic 8 50%x50%+10+10",
     .parameters = kMosaic,
     .works = Works::Neighborhood,
     .apply = Mosaic,
     .reach = ReachOfMosaic},
    {.name = "kernel",
     .family = Family::Filter,
     .label = "Custom filter",
     .help = "Convolves the picture with your own weights.",
     .example = "kernel \"0 -1 0 -1 5 -1 0 -1 0\"",
     .parameters = kKernel,
     .works = Works::Neighborhood,
     .apply = Kernel,
     .reach = ReachOfKernel,
     .check = CheckKernel},
    {.name = "red-eye",
     .family = Family::Filter,
     .label = "Red-eye removal",
     .help = "Removes red eyes caused by a flash.",
     .example = "red-eye 50%x50%+10%+10%",
     .parameters = kRedEye,
     .works = Works::Neighborhood,
     .apply = RedEye,
     .reach = ReachOfRedEye,
     .check = CheckRedEye},
};

}  // namespace

std::span<const Operation> FilterOperations() { return kOperations; }

}  // namespace fotomill
