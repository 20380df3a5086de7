#include "cli/commands/tag.h"

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "batch/rewrite/tag_file.h"
#include "cli/frame/options.h"
#include "cli/selection/rewrite_options.h"
#include "core/text.h"
#include "core/utf8.h"
#include "metadata/tags/tag_lines.h"
#include "settings/job_options.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct TagOptions {
  RewriteOptions rewrite;
  std::string rating, label;
  // as typed; none: not given
  std::vector<std::string> keywords, added, removed, comment;
  bool sidecar = false;
};

// The keywords of several lists.
std::vector<std::string> AllKeywords(const std::vector<std::string>& lists) {
  std::vector<std::string> keywords;
  for (const std::string& list : lists) {
    for (std::string& keyword : ListedKeywords(list)) keywords.push_back(std::move(keyword));
  }
  return keywords;
}

// Whether a text can be stored: valid UTF-8 without control characters other than line ends and
// tabs.
bool IsStorable(const std::string& text) {
  return IsUtf8(text) && std::ranges::none_of(text, [](char c) {
           const auto byte = static_cast<unsigned char>(c);
           return (byte < 0x20 && c != '\n' && c != '\r' && c != '\t') || byte == 0x7F;
         });
}

// Returns an error message, empty if the options are valid.
std::string TakeChanges(const TagOptions& options, TagChanges& changes) {
  if (!options.rating.empty())
    changes.rating =
        options.rating == "rejected" ? -1 : static_cast<int32_t>(LeadingInteger(options.rating));
  for (const std::string_view name : kLabelNames) {
    if (EqualIgnoringCase(options.label, name)) changes.label = name;
  }
  if (options.label == "none") changes.label = "";
  if (!options.keywords.empty()) changes.keywords = AllKeywords(options.keywords);
  changes.addedKeywords = AllKeywords(options.added);
  changes.removedKeywords = AllKeywords(options.removed);
  if (options.comment.size() > 1) return Tr("%1 was given twice.", "--comment");
  if (!options.comment.empty()) changes.description = options.comment.front();
  if (changes.Empty())
    return Tr(
        "Choose --rating, --label, --keywords, --add-keyword, --remove-keyword or --comment.");
  for (const auto* texts :
       {&options.keywords, &options.added, &options.removed, &options.comment}) {
    if (!std::ranges::all_of(*texts, IsStorable))
      return Tr("A text is not valid UTF-8 or has control characters.");
  }
  return {};
}

int RunTagCommand(TagOptions& options, const CommandContext& context) {
  TagRequest tags;
  if (const std::string wrong = TakeChanges(options, tags.changes); !wrong.empty())
    return UsageError(context, wrong);
  RewriteOptions& rewrite = options.rewrite;
  if (options.sidecar) {
    if (rewrite.inPlace || !rewrite.dest.empty() || !rewrite.out.empty())
      return UsageError(context,
                        Tr("--sidecar cannot be combined with --in-place, --dest or --out."));
    rewrite.inPlace = true;
  }
  tags.sidecarOnly = options.sidecar;
  tags.commentFiles = WritesCommentsFromSettings();
  tags.sources = TagSourcesFromSettings();
  const auto selection = SelectForRewrite(rewrite, context);
  if (!selection) return kExitUsage;
  RewriteFunction function = RewriteFunctionOf(rewrite);
  function.unchanged = TrLater("already so.");
  function.listedTwice = TrLater("listed twice; already changed.");
  function.rewrite = [&](const std::string& source, const std::string& destination,
                         const RewriteRequest& request, const WriteOptions& write) {
    return TagPictureFile(source, destination, tags, request, write);
  };
  return RunRewriteJob(rewrite, *selection, context, [&](BatchJob& job) {
    (void)RunRewrite(selection->files, function, job);  // TerminalBox always opens
  });
}

}  // namespace

void SetUpTag(CLI::App& app, CommandContext& context) {
  auto options = std::make_shared<TagOptions>();
  AddSelection(app, options->rewrite.selection, context);
  AddChoice(app, "--rating", options->rating, "N", "Stars: 1 to 5, 0 for none, or rejected",
            {"0", "1", "2", "3", "4", "5", "rejected"});
  AddChoice(app, "--label", options->label, "COLOR", "Color label, or none",
            {"none", "red", "yellow", "green", "blue", "purple"});
  AddRepeatedText(app, "--keywords", options->keywords, "LIST",
                  "Replace the keywords by these, separated by commas; \"\" removes all");
  AddRepeatedText(app, "--add-keyword", options->added, "LIST",
                  "Add keywords; may be given several times");
  AddRepeatedText(app, "--remove-keyword", options->removed, "LIST",
                  "Remove keywords; may be given several times");
  AddRepeatedText(app, "--comment", options->comment, "TEXT",
                  "Set the description; \"\" removes it");
  AddFlag(app, "--sidecar", options->sidecar,
          "Write to a sidecar beside each picture, FILE.EXT.xmp; the pictures stay as they are");
  AddRewriteOptions(app, options->rewrite);
  SetFooter(app,
            "Changes XMP, and IPTC and EXIF where these have the same tags, in JPEG, TIFF, PNG, "
            "WebP, HD Photo, GIF and PSD files; everything\n"
            "else stays the same bytes. Other pictures, camera raw files and files that cannot be "
            "changed safely get a sidecar, which\n"
            "digiKam, darktable and Lightroom read. An existing sidecar is kept up to date.",
            "fotomill tag holiday --in-place --rating 4 --add-keyword \"lake,summer\"");
  context.run = [options, &context] { return RunTagCommand(*options, context); };
}

}  // namespace fotomill::cli
