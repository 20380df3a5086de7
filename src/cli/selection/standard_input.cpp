#include "cli/selection/standard_input.h"

#include <algorithm>
#include <vector>

#include "core/text.h"
#include "platform/input.h"
#include "platform/paths.h"
#include "registry/registry.h"
#include "registry/signature.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr size_t kPiece = 256 * 1024;
constexpr uint64_t kMostBytes = uint64_t{2} << 30;  // temporary files may be in memory

BatchFile Failed(Status status, std::string hint) {
  return {.name = kStream, .below = {}, .status = status, .hint = std::move(hint)};
}

// Fills the buffer up to the end of input; nullopt if reading fails.
std::optional<size_t> ReadPiece(const Io& io, std::span<uint8_t> buffer) {
  size_t done = 0;
  while (done < buffer.size()) {
    const auto count = ReadInput(io, buffer.subspan(done));
    if (!count) return std::nullopt;
    if (*count == 0) break;
    done += *count;
  }
  return done;
}

// The extension of the most likely format that can be read; empty if none.
std::string ExtensionOfContents(std::span<const uint8_t> head) {
  for (const std::string_view extension : IdentifySignature(head).extensions) {
    const int32_t row = FindReaderByName("x." + std::string(extension));
    if (row != kNoFormat && CanRead(FormatRow(row))) return LowerCase(extension);
  }
  return {};
}

std::string WhyUnknown(std::span<const uint8_t> head) {
  const std::string_view name = IdentifySignature(head).name;
  return (name.empty() ? std::string() : Tr("It looks like %1.", Tr(name)) + " ") +
         Tr("Name the format with --from.");
}

}  // namespace

std::optional<size_t> ReadInput(const Io& io, std::span<uint8_t> buffer) {
  if (io.in == stdin) return platform::ReadInput(buffer);
  return std::fread(buffer.data(), 1, buffer.size(), io.in);
}

bool StandardInput::Create(const std::string& extension) {
  if (!folder_.Create()) return false;
  path_ = platform::JoinFolder(folder_.Path(), "stdin." + extension);
  return file_.Create(path_);
}

BatchFile StandardInput::Take(const Io& io, const std::string& from) {
  std::vector<uint8_t> buffer(kPiece);
  uint64_t total = 0;
  for (bool more = true; more;) {
    const auto count = ReadPiece(io, buffer);
    if (!count) return Failed(Status::FileReadError, ReasonSentence());
    const std::span<const uint8_t> piece = std::span(buffer).first(*count);
    if (total == 0 && piece.empty())
      return Failed(Status::FileReadError, Tr("Standard input is empty."));
    if (total == 0) {
      const auto head = piece.first(std::min(piece.size(), kSignatureBytes));
      const std::string extension = from.empty() ? ExtensionOfContents(head) : from;
      if (extension.empty()) return Failed(Status::UnsupportedFormat, WhyUnknown(head));
      if (!Create(extension)) return Failed(Status::ErrorCreatingFile, ReasonSentence());
    }
    total += piece.size();
    if (total > kMostBytes)
      return Failed(Status::FileReadError, Tr("Standard input is larger than 2 GB."));
    if (!file_.Write(piece)) return Failed(Status::ErrorWritingFile, ReasonSentence());
    more = piece.size() == kPiece;
  }
  if (file_.Commit(platform::Existing::Refuse) != platform::CommitResult::Done)
    return Failed(Status::ErrorWritingFile, ReasonSentence());
  return {.name = path_, .below = {}, .status = Status::Ok, .hint = {}};
}

}  // namespace fotomill::cli
