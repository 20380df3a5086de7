#pragma once

#include <set>
#include <string>
#include <vector>

#include "core/status.h"

namespace fotomill {

// A file to add to an archive.
struct ArchiveMember {
  std::string path, name;      // on disk; in the archive
  Status status = Status::Ok;  // otherwise it cannot be added
  std::string hint = {};       // a sentence
};

// How files are named in an archive.
struct MemberNaming {
  // Names are relative to it, if the file is in it; empty: the whole path is the name.
  std::string base = {};
  bool keepPaths = true;       // otherwise only the file's name
  bool addThumbnails = false;  // add thumbnail files with their pictures
};

// Collects files for an archive; folders recursively, without following links. The archive itself
// is left out, and so is a file that was added before.
class ArchiveMembers {
 public:
  ArchiveMembers(const std::string& archive, MemberNaming naming);
  void Add(const std::string& path);  // a file or a folder
  const std::vector<ArchiveMember>& All() const { return members_; }

 private:
  void AddFolder(const std::string& folder);
  void AddFile(const std::string& path);
  void AddMember(const std::string& path);
  std::string NameOf(const std::string& path) const;

  const std::string archive_;
  const MemberNaming naming_;
  std::vector<ArchiveMember> members_;
  std::set<std::string> paths_, names_;
};

}  // namespace fotomill
