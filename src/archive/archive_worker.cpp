// The worker process; see archive_exchange.h.
#include <algorithm>
#include <chrono>
#include <cstring>
#include <string>
#include <thread>

#include "archive/archive_exchange.h"
#include "archive/archive_reader.h"

namespace fotomill {

namespace {

constexpr auto kWait = std::chrono::microseconds(20);

class Sender final : public ArchiveSink {
 public:
  Sender(ArchiveExchange& exchange, const platform::ApartCall& call, bool data)
      : exchange_(exchange), call_(call), data_(data) {}

  bool Entry(const RawEntry& entry, std::string_view name) override {
    // one byte more than allowed shows that it is too long
    name = name.substr(0, kLongestEntryName + 1);
    Put(RecordHead::Entry, {reinterpret_cast<const uint8_t*>(&entry), sizeof entry},
        {reinterpret_cast<const uint8_t*>(name.data()), name.size()});
    const uint32_t index = count_++;
    return data_ && index < kMostWanted && (exchange_.wanted[index / 8] >> (index % 8) & 1) != 0;
  }
  void Data(std::span<const uint8_t> bytes) override { Put(RecordHead::Data, bytes); }
  void EndEntry(const ArchiveEnd& end) override { PutEnd(RecordHead::EndEntry, end); }

  void End(const ArchiveEnd& end) {
    PutEnd(RecordHead::End, end);
    Flush();
  }

 private:
  void PutEnd(RecordHead::Kind kind, const ArchiveEnd& end) {
    Put(kind, {reinterpret_cast<const uint8_t*>(&end), sizeof end});
  }
  void Put(RecordHead::Kind kind, std::span<const uint8_t> bytes,
           std::span<const uint8_t> more = {}) {
    const RecordHead head = {kind, static_cast<uint32_t>(bytes.size() + more.size())};
    if (filled_ + sizeof head + head.size > kExchangeBlock) Flush();
    Append({reinterpret_cast<const uint8_t*>(&head), sizeof head});
    Append(bytes);
    Append(more);
  }
  void Append(std::span<const uint8_t> bytes) {
    std::ranges::copy(bytes, exchange_.block + filled_);
    filled_ += static_cast<uint32_t>(bytes.size());
  }
  void Flush() {
    call_.tell(static_cast<int32_t>(filled_));
    ++flushes_;
    filled_ = 0;
    while (exchange_.taken.load(std::memory_order_acquire) != flushes_)
      std::this_thread::sleep_for(kWait);
  }

  ArchiveExchange& exchange_;
  const platform::ApartCall& call_;
  const bool data_;
  uint32_t filled_ = 0, flushes_ = 0, count_ = 0;
};

}  // namespace

bool ReadArchiveApart(const platform::ApartCall& call) {
  ExchangeRequest request;
  if (call.request.size() < sizeof request || call.reply.size() < sizeof(ArchiveExchange))
    return false;
  std::memcpy(&request, call.request.data(), sizeof request);
  const auto rest = call.request.subspan(sizeof request);
  if (rest.size() != request.password) return false;
  auto& exchange = *reinterpret_cast<ArchiveExchange*>(call.reply.data());
  Sender sender(exchange, call, request.data != 0);
  sender.End(
      WalkArchive(call.input, std::string(rest.begin(), rest.end()), request.mostEntries, sender));
  return true;
}

}  // namespace fotomill
