#include "operations/operations.h"
#include "processing/filters/box_blur.h"
#include "processing/filters/gaussian.h"
#include "processing/filters/rank.h"

// Filters: what becomes of a pixel depends on its neighbors.
namespace fotomill {

namespace {

using enum ParameterKind;

constexpr Parameter kSigma = {.name = "sigma", .kind = kNumber, .unit = "px", .preset = "1", .least = 0.1, .most = 1000,
                              .label = "Sigma", .help = "Standard deviation of the Gaussian."};
constexpr Parameter kBlur[] = {kSigma};
constexpr Parameter kUnsharp[] = {
    kSigma,
    {.name = "amount", .kind = kNumber, .preset = "1", .least = 0, .most = 10, .label = "Amount",
     .help = "How much of the difference to the blurred picture is added; 1 is 100 %."},
    {.name = "threshold", .kind = kNumber, .unit = "levels", .preset = "0", .least = 0, .most = 255, .label = "Threshold",
     .help = "Smaller differences are left alone."},
};

GaussianPlace PlaceOf(const OperationContext& context) { return {context.left, context.top}; }
int32_t Reach(const Arguments& arguments) { return GaussianReach(arguments.Number("sigma")); }

Status Blur(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return BlurPicture(picture, arguments.Number("sigma"), PlaceOf(context), context.work);
}
Status Sharpen(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return UnsharpPicture(picture, arguments.Number("sigma"), 1, 0, PlaceOf(context), context.work);
}
Status Unsharp(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return UnsharpPicture(picture, arguments.Number("sigma"), arguments.Number("amount"), arguments.Number("threshold"),
                        PlaceOf(context), context.work);
}

constexpr Parameter kRadius = {.name = "radius", .kind = kInteger, .unit = "px", .preset = "1", .least = 0,
                               .most = kMostRankRadius, .label = "Radius",
                               .help = "A square of twice as many pixels and one more on each side counts."};
constexpr Parameter kWindow[] = {kRadius};
static_assert(kMostBoxRadius >= kMostRankRadius);

int32_t Radius(const Arguments& arguments) { return arguments.Integer("radius"); }

Status BoxBlur(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return BoxBlurPicture(picture, Radius(arguments), context.work);
}
template <Rank rank>
Status ApplyRank(PictureRecord& picture, const Arguments& arguments, const OperationContext& context) {
  return RankPicture(picture, rank, Radius(arguments), context.work);
}

constexpr Operation kOperations[] = {
    {.name = "blur", .family = Family::Filter, .label = "Gaussian blur", .help = "Blurs a picture evenly.", .example = "blur 2",
     .parameters = kBlur, .works = Works::Neighborhood, .apply = Blur, .reach = Reach},
    {.name = "sharpen", .family = Family::Filter, .label = "Sharpen", .help = "Makes edges stand out.", .example = "sharpen 0.6",
     .parameters = kBlur, .works = Works::Neighborhood, .apply = Sharpen, .reach = Reach},
    {.name = "unsharp", .family = Family::Filter, .label = "Unsharp mask",
     .help = "Sharpens by adding the difference to a blurred copy.", .example = "unsharp 1.5 0.8 threshold=3",
     .parameters = kUnsharp, .works = Works::Neighborhood, .apply = Unsharp, .reach = Reach},
    {.name = "box-blur", .family = Family::Filter, .label = "Box blur",
     .help = "Replaces each pixel by the mean of a square around it.", .example = "box-blur 3", .parameters = kWindow,
     .works = Works::Neighborhood, .apply = BoxBlur, .reach = Radius},
    {.name = "median", .family = Family::Filter, .label = "Median",
     .help = "Replaces each pixel by the median of a square around it: removes specks and keeps edges.", .example = "median 2",
     .parameters = kWindow, .works = Works::Neighborhood, .apply = ApplyRank<Rank::Median>, .reach = Radius},
    {.name = "minimum", .family = Family::Filter, .label = "Minimum",
     .help = "Replaces each pixel by the darkest level of a square around it: dark parts grow.", .example = "minimum 2",
     .parameters = kWindow, .works = Works::Neighborhood, .apply = ApplyRank<Rank::Minimum>, .reach = Radius},
    {.name = "maximum", .family = Family::Filter, .label = "Maximum",
     .help = "Replaces each pixel by the brightest level of a square around it: bright parts grow.", .example = "maximum 2",
     .parameters = kWindow, .works = Works::Neighborhood, .apply = ApplyRank<Rank::Maximum>, .reach = Radius},
};

}  // namespace

std::span<const Operation> FilterOperations() { return kOperations; }

}  // namespace fotomill
