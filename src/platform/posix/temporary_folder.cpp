#include "platform/temporary_folder.h"

#include <stdlib.h>

#include <cerrno>
#include <filesystem>
#include <system_error>

#include "platform/fault.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/posix/kept_reason.h"
#include "platform/posix/stale_files.h"
#include "platform/reason.h"

namespace fotomill::platform {

bool TemporaryFolder::Create() {
  Delete();
  const std::string folder = SpecialFolderPath(SpecialFolder::Temporary);
  DeleteStaleFiles(folder);
  ForgetReason();
  std::string path = JoinFolder(folder, "FMWT" + OwnerOfTemporary() + "-XXXXXX");
  if (FaultDue()) {
    errno = EIO;
  } else if (mkdtemp(path.data()) != nullptr) {
    path_ = std::move(path);
    return true;
  }
  KeepErrno();
  return false;
}

void TemporaryFolder::Delete() {
  std::error_code ignored;
  if (!path_.empty()) std::filesystem::remove_all(path_, ignored);
  path_.clear();
}

}  // namespace fotomill::platform
