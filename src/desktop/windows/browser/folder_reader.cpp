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
  facts_.Start(
      [this, folder, wanted = std::move(wanted)](const StopToken& stop,
                                                 const LooseWork::Report& report) {
        const auto send = [&](PlacedItems found, bool last) {
          report([this, found = std::move(found), last] {
            if (last) facts_.Stop();
            events_.factsFound(found, last);
          });
        };
        PlacedItems found;
        for (const auto& [place, item] : wanted) {
          if (stop.Asked()) return;
          FolderItem facts = item;
          AddPictureFacts(folder, facts);
          if (facts.width > 0) found.emplace_back(place, std::move(facts));
          if (found.size() == kBunch) send(std::exchange(found, {}), false);
        }
        send(std::move(found), true);
      },
      [this] {
        facts_.Stop();
        events_.factsFound({}, true);
      });
}

void FolderReader::ReadTags(const std::string& folder, PlacedItems wanted) {
  tags_.Start(
      [this, folder, wanted = std::move(wanted)](const StopToken& stop,
                                                 const LooseWork::Report& report) {
        const auto send = [&](PlacedItems found, bool last) {
          report([this, found = std::move(found), last] {
            if (last) tags_.Stop();
            events_.tagsFound(found, last);
          });
        };
        PlacedItems found;
        for (const auto& [place, item] : wanted) {
          if (stop.Asked()) return;
          FolderItem tags = item;
          AddPictureTags(folder, tags);
          found.emplace_back(place, std::move(tags));
          if (found.size() == kBunch) send(std::exchange(found, {}), false);
        }
        send(std::move(found), true);
      },
      [this] {
        tags_.Stop();
        events_.tagsFound({}, true);
      });
}

}  // namespace fotomill::desktop
