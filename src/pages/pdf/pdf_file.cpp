#include "pages/pdf/pdf_file.h"

#include <libdeflate.h>

#include <charconv>
#include <cmath>
#include <cstdio>
#include <memory>

#include "core/utf8.h"
#include "picture/write_options.h"

namespace fotomill {

namespace {

constexpr int kLevel = 6;
constexpr char32_t kUnknown = 0xFFFD;

bool IsPlain(std::string_view text) {
  for (const char c : text) {
    if (c < 0x20 || c > 0x7E) return false;
  }
  return true;
}

void AddHex(uint32_t unit, std::string& hex) {
  constexpr const char* kDigits = "0123456789ABCDEF";
  for (int shift = 12; shift >= 0; shift -= 4) hex += kDigits[unit >> shift & 15];
}

}  // namespace

std::string PdfNumber(double value) {
  if (!std::isfinite(value)) value = 0;
  char digits[64];
  const auto [end, error] =
      std::to_chars(digits, digits + sizeof digits, value, std::chars_format::fixed, 4);
  if (error != std::errc()) return "0";
  std::string number(digits, end);
  while (number.back() == '0') number.pop_back();
  if (number.back() == '.') number.pop_back();
  return number == "-0" ? "0" : number;
}

std::string PdfText(std::string_view utf8) {
  if (IsPlain(utf8)) {
    std::string text = "(";
    for (const char c : utf8) {
      if (c == '(' || c == ')' || c == '\\') text += '\\';
      text += c;
    }
    return text + ")";
  }
  std::string text = "<FEFF";
  while (!utf8.empty()) {
    const char32_t c = NextCharacter(utf8, kUnknown);
    if (c >= 0x10000) {
      AddHex(0xD800 + ((c - 0x10000) >> 10), text);
      AddHex(0xDC00 + ((c - 0x10000) & 0x3FF), text);
    } else {
      AddHex(c, text);
    }
  }
  return text + ">";
}

std::string PdfReference(int32_t object) { return std::to_string(object) + " 0 R"; }

Status PdfFile::Create(const std::string& path) {
  if (!out_.Create(path)) return Status::ErrorCreatingFile;
  out_.Text("%PDF-1.7\n%\xE2\xE3\xCF\xD3\n");
  return Status::Ok;
}

int32_t PdfFile::NewObject() {
  offsets_.push_back(0);
  return static_cast<int32_t>(offsets_.size());
}

void PdfFile::Begin(int32_t object) {
  offsets_[static_cast<size_t>(object) - 1] = out_.Position();
  out_.Text(std::to_string(object) + " 0 obj\n");
}

void PdfFile::Write(int32_t object, std::string_view value) {
  Begin(object);
  out_.Text(value);
  out_.Text("\nendobj\n");
}

void PdfFile::WriteStream(int32_t object, std::string_view entries,
                          std::span<const uint8_t> bytes) {
  Begin(object);
  out_.Text("<< ");
  out_.Text(entries);
  out_.Text(std::string(" /Length ") + std::to_string(bytes.size()) + " >>\nstream\n");
  out_.Bytes(bytes);
  out_.Text("\nendstream\nendobj\n");
}

Status PdfFile::WriteDeflated(int32_t object, std::string_view entries,
                              std::span<const uint8_t> bytes) {
  std::vector<uint8_t> packed;
  RETURN_IF_BAD(Deflated(bytes, packed));
  WriteStream(object, std::string(entries) + " /Filter /FlateDecode", packed);
  return Status::Ok;
}

Status PdfFile::Finish(int32_t catalog, int32_t info, const std::string& id,
                       platform::Existing existing) {
  const uint64_t start = out_.Position();
  constexpr uint64_t kMostBytes = 9'999'999'999;  // offsets have ten digits
  if (start > kMostBytes) return Status::ErrorWritingFile;
  out_.Text(std::string("xref\n0 ") + std::to_string(offsets_.size() + 1) +
            "\n0000000000 65535 f \n");
  for (const uint64_t offset : offsets_) {
    char line[32];
    std::snprintf(line, sizeof line, "%010llu %05d %c \n", static_cast<unsigned long long>(offset),
                  offset == 0 ? 65535 : 0, offset == 0 ? 'f' : 'n');
    out_.Text(line);
  }
  out_.Text(std::string("trailer\n<< /Size ") + std::to_string(offsets_.size() + 1) + " /Root " +
            PdfReference(catalog) + " /Info " + PdfReference(info) + " /ID [<" + id + "> <" + id +
            ">] >>\nstartxref\n" + std::to_string(start) + "\n%%EOF\n");
  return CommitStatus(out_.Commit(existing));
}

Status Deflated(std::span<const uint8_t> bytes, std::vector<uint8_t>& packed) {
  const std::unique_ptr<libdeflate_compressor, decltype(&libdeflate_free_compressor)> compressor(
      libdeflate_alloc_compressor(kLevel), libdeflate_free_compressor);
  if (compressor == nullptr) return Status::MemoryAllocationError;
  packed.resize(libdeflate_zlib_compress_bound(compressor.get(), bytes.size()));
  packed.resize(libdeflate_zlib_compress(compressor.get(), bytes.data(), bytes.size(),
                                         packed.data(), packed.size()));
  return Status::Ok;
}

}  // namespace fotomill
