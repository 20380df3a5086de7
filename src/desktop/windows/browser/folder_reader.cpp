#include "desktop/windows/browser/folder_reader.h"

#include <memory>

namespace fotomill::desktop {

namespace {

constexpr size_t kBunch = 200;

}  // namespace

void FolderReader::List(const std::string& folder, bool namesFirst, bool subfolders) {
  facts_.Stop();
  tags_.Stop();
  listing_.Start(
      [this, folder, namesFirst, subfolders](const StopToken& stop,
                                             const LooseWork::Report& report) {
        const auto send = [&](FolderListing listing, bool complete) {
          // Reports are copied on their way, which a large listing should not be.
          const auto sent = std::make_shared<FolderListing>(std::move(listing));
          report([this, sent, complete] {
            if (complete) listing_.Stop();
            events_.listed(std::move(*sent), complete);
          });
        };
        FolderListing listing =
            subfolders ? ListWithSubfolders(folder, stop) : ListForBrowser(folder, false, stop);
        if (namesFirst && listing.state == FolderState::Listed && !stop.Asked())
          send(FolderListing(listing), false);
        AddFacts(folder, listing, stop);
        if (!stop.Asked()) send(std::move(listing), true);
      },
      [this] {
        listing_.Stop();
        events_.listed({}, true);  // like an unreadable folder
      });
}

void FolderReader::ListFound(const std::string& folder, std::vector<std::string> names) {
  facts_.Stop();
  tags_.Stop();  // as they are by number of an item
  listing_.Start(
      [this, folder, names = std::move(names)](const StopToken& stop,
                                               const LooseWork::Report& report) {
        const auto sent = std::make_shared<FolderListing>(ListNames(folder, names, stop));
        AddFacts(folder, *sent, stop);
        if (stop.Asked()) return;
        report([this, sent] {
          listing_.Stop();
          events_.listed(std::move(*sent), true);
        });
      },
      [this] {
        listing_.Stop();
        events_.listed({}, true);
      });
}

void FolderReader::ReadFacts(const std::string& folder, PlacedItems wanted) {
  const auto read = [folder](FolderItem& item) {
    AddPictureFacts(folder, item);
    return item.width > 0;
  };
  ReadItems(facts_, std::move(wanted), read, events_.factsFound);
}

void FolderReader::ReadTags(const std::string& folder, PlacedItems wanted) {
  const auto read = [folder](FolderItem& item) {
    AddPictureTags(folder, item);
    return true;
  };
  ReadItems(tags_, std::move(wanted), read, events_.tagsFound);
}

// `read` adds to an item, and returns whether it is delivered.
void FolderReader::ReadItems(LooseWork& work, PlacedItems wanted,
                             std::function<bool(FolderItem& item)> read, const Found& found) {
  work.Start(
      [&work, &found, read = std::move(read), wanted = std::move(wanted)](
          const StopToken& stop, const LooseWork::Report& report) {
        const auto send = [&](PlacedItems bunch, bool last) {
          report([&work, &found, bunch = std::move(bunch), last] {
            if (last) work.Stop();
            found(bunch, last);
          });
        };
        PlacedItems bunch;
        for (const auto& [place, item] : wanted) {
          if (stop.Asked()) return;
          FolderItem filled = item;
          if (read(filled)) bunch.emplace_back(place, std::move(filled));
          if (bunch.size() == kBunch) send(std::exchange(bunch, {}), false);
        }
        send(std::move(bunch), true);
      },
      [&work, &found] {
        work.Stop();
        found({}, true);
      });
}

}  // namespace fotomill::desktop
