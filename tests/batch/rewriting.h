#pragma once

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "batch/rewrite/rewrite_run.h"
#include "files/previous_file.h"

namespace fotomill::test {

using Rewriter = decltype(RewriteFunction::rewrite);

// Rewrites files in place, keeping what undo needs in `previous`.
inline void RewriteInPlace(const std::vector<std::string>& paths, Rewriter rewriter,
                           PreviousFiles& previous) {
  std::vector<BatchFile> files;
  for (const std::string& path : paths) files.push_back({.name = path, .below = {}, .hint = {}});
  RewriteFunction function;
  function.rewrite = std::move(rewriter);
  function.inPlace = true;
  function.keepPrevious = [&](const std::string& path) { return previous.Keep(path); };
  function.replaced = [&](const std::string& path) { previous.Replaced(path); };
  BatchJob job;
  ASSERT_EQ(RunRewrite(files, function, job), Status::Ok);
  EXPECT_FALSE(job.errors);
}

}  // namespace fotomill::test
