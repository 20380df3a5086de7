#include "operations/recipe_library.h"

#include <algorithm>

#include "core/data_folder.h"
#include "core/limits.h"
#include "core/plain_name.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "texts/name_hint.h"
#include "texts/system_reason.h"

namespace fotomill {

namespace {

constexpr std::string_view kFolder = "recipes", kEnding = ".recipe";

struct ShippedRecipe {
  const char* name;
  const char* text;
};

// Sorted by name.
constexpr ShippedRecipe kShipped[] = {
    {"black-and-white", R"(# Black and white with a little more contrast
gray
contrast 12
)"},
    {"enlarge", R"(# Twice the size, then sharpened
resize 200% filter=lanczos3
unsharp 1 0.5
)"},
    {"print-10x15", R"(# 10 x 15 cm at 300 dots an inch, cut to fill the paper
resize 1772x1181 mode=fill filter=lanczos3
unsharp 0.8 0.7
)"},
    {"square", R"(# The middle of the picture as a square for profiles
crop 1:1
resize 1080x1080 filter=lanczos3 only=shrink
sharpen 0.5
)"},
    {"thumbnail", R"(# Small and sharp
resize 320x320 filter=lanczos3 only=shrink
sharpen 0.5
)"},
    {"web", R"(# Two sizes for the web
output large
  resize 2048x2048 filter=lanczos3 only=shrink
  sharpen 0.6
  save to=jpg quality=85
output small
  resize 400x400 filter=lanczos3 only=shrink
  sharpen 0.5
  save to=jpg max-bytes=40k
)"},
};

std::string FolderOfRecipes() {
  const std::string& data = DataFolder();
  return data.empty() ? data : platform::JoinFolder(data, kFolder);
}

std::string ReadFile(const std::string& path, std::string& text) {
  constexpr uint64_t kMost = 1 << 20;
  switch (platform::ReadWholeFile(path, kMost, text)) {
    case platform::ReadResult::Done: return {};
    case platform::ReadResult::Missing: return Tr("There is no recipe \"%1\".", path);
    case platform::ReadResult::TooLarge: return Tr("\"%1\" is longer than a megabyte.", path);
    case platform::ReadResult::Failed: break;
  }
  return WithReason(Tr("\"%1\" cannot be read.", path));
}

}  // namespace

std::vector<NamedRecipe> ListRecipes() {
  std::vector<NamedRecipe> recipes;
  const std::string folder = FolderOfRecipes();
  if (const auto entries = folder.empty() ? std::nullopt : platform::ListFolder(folder)) {
    for (const platform::FolderEntry& entry : *entries) {
      if (!entry.name.ends_with(kEnding) || entry.name.size() == kEnding.size()) continue;
      recipes.push_back({entry.name.substr(0, entry.name.size() - kEnding.size()),
                         platform::JoinFolder(folder, entry.name)});
    }
  }
  for (const ShippedRecipe& shipped : kShipped) {
    if (std::ranges::find(recipes, shipped.name, &NamedRecipe::name) == recipes.end())
      recipes.push_back({shipped.name, {}});
  }
  std::ranges::sort(recipes, {}, &NamedRecipe::name);
  return recipes;
}

std::string FindRecipe(const std::string& nameOrFile, std::string& text, std::string& path) {
  path = nameOrFile;
  const bool file =
      nameOrFile.ends_with(kEnding) || nameOrFile.find_first_of("/\\") != std::string::npos;
  if (file) return ReadFile(path, text);
  const std::vector<NamedRecipe> recipes = ListRecipes();
  const auto found = std::ranges::find(recipes, nameOrFile, &NamedRecipe::name);
  if (found != recipes.end()) {
    path = found->path;
    if (!path.empty()) return ReadFile(path, text);
    text = std::ranges::find(kShipped, nameOrFile, &ShippedRecipe::name)->text;
    return {};
  }
  if (platform::FileExists(nameOrFile)) return ReadFile(path, text);
  std::vector<std::string_view> names;
  for (const NamedRecipe& recipe : recipes) names.emplace_back(recipe.name);
  return Tr("There is no recipe \"%1\".", nameOrFile) + NearestNameHint(nameOrFile, names);
}

std::string RecipePath(const std::string& name) {
  const std::string folder = FolderOfRecipes();
  if (folder.empty() || name.empty() || !IsPlainName(name)) return {};
  return platform::JoinFolder(folder, name + std::string(kEnding));
}

std::string SaveRecipe(const std::string& path, const std::string& text) {
  if (platform::MakeFolders(platform::FolderOf(path)) && platform::WriteWholeFile(path, text))
    return {};
  return WithReason(Tr("\"%1\" cannot be created.", path));
}

}  // namespace fotomill
