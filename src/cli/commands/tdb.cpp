#include "cli/commands/tdb.h"

#include <atomic>
#include <memory>
#include <string>
#include <vector>

#include "batch/picture_failure.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "cli/frame/options.h"
#include "cli/frame/result_output.h"
#include "cli/frame/used_files.h"
#include "cli/selection/file_selection.h"
#include "core/fixed_text.h"
#include "core/workers/folder_scope.h"
#include "core/workers/ordered_run.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/process.h"
#include "settings/job_options.h"
#include "texts/system_reason.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

struct TdbOptions {
  SelectionOptions selection;
  std::string out;
  std::string overwrite = "refuse";
  int32_t jobs = 0;
  bool purge = false;
  bool dryRun = false;
  bool json = false;
};

constexpr const char* kNoDatabase = TrLater("Not a readable thumbnail database; left unchanged.");
constexpr const char* kNotAdded = TrLater("The thumbnail could not be added to the database.");
constexpr const char* kNotFound = TrLater("The database has no thumbnail of this picture.");
constexpr const char* kNoCurrent =
    TrLater("The database has no thumbnail of this picture as it is now.");
constexpr const char* kExists = TrLater("The file exists; use --overwrite replace to replace it.");
constexpr size_t kAddedAtOnce = 64;  // pictures, about 2 MB

enum class Access { Read, Change, Create };

// Opens a database; false after printing a message.
bool OpenDatabase(ThumbnailDatabase& database, const std::string& path, Access access,
                  ResultOutput& output) {
  const bool hidden = ThumbnailOptionsFromSettings().hidden;
  switch (access == Access::Read
              ? database.OpenToRead(path, hidden)
              : database.OpenThumbnailDatabase(path, access == Access::Create, hidden)) {
    case ThumbnailDatabase::Opened::Done: return true;
    case ThumbnailDatabase::Opened::Missing: output.FileFailed(path, Status::FileOpenError); break;
    case ThumbnailDatabase::Opened::NotRead:
      if (const std::string reason = ReasonSentence(); !reason.empty()) {
        output.FileFailed(path, Status::FileOpenError, reason);
      } else {
        output.FileFailed(path, Status::DamagedFile, Tr(kNoDatabase));
      }
      break;
    case ThumbnailDatabase::Opened::Failed:
      output.FileFailed(path, Status::ErrorCreatingFile, ReasonSentence());
      break;
  }
  return false;
}

// A record for a picture, made on any thread.
struct Adding {
  Status status = Status::Ok;
  std::string hint;
  std::unique_ptr<DatabaseRecord> record;
};

Adding MakeRecord(const SelectedFile& file, const ThumbnailOptions& options) {
  Adding adding{file.status, file.hint, std::make_unique<DatabaseRecord>()};
  if (adding.status != Status::Ok) return adding;
  adding.record->path = platform::AbsolutePath(file.name);
  if (adding.record->path.size() > PathText::Capacity()) {
    adding.status = Status::InvalidDestination;
    adding.hint = Tr("The path is longer than 260 characters.");
    return adding;
  }
  adding.record->stamp = PictureStampOf(adding.record->path);  // before reading it
  adding.status = MakeThumbnailOfFile(file.name, options, adding.record->thumbnail);
  if (adding.status != Status::Ok) adding.hint = OpenHint(file.name, adding.status);
  adding.record->volume = VolumeKeyFor(adding.record->path);
  return adding;
}

// Appends records in blocks, as each append waits for the disk.
class Appending {
 public:
  Appending(ThumbnailDatabase& database, ResultOutput& output, bool history)
      : database_(database), output_(output), used_(FileFunction::Catalog, history) {}

  void Add(const SelectedFile& file, Adding& adding) {
    if (adding.status != Status::Ok) {
      Flush();
      output_.FileFailed(file.name, adding.status, adding.hint);
      return;
    }
    names_.push_back(file.name);
    records_.push_back(std::move(*adding.record));
    if (records_.size() == kAddedAtOnce) Flush();
  }

  void Flush() {
    const bool added = records_.empty() || database_.AppendDatabaseRecords(records_, true);
    for (const std::string& name : names_) {
      if (!added) {
        output_.FileFailed(name, Status::ErrorWritingFile, Tr(kNotAdded));
        continue;
      }
      used_.Add(name);
      output_.FileDone(name);
    }
    names_.clear();
    records_.clear();
  }

 private:
  ThumbnailDatabase& database_;
  ResultOutput& output_;
  UsedFiles used_;
  std::vector<std::string> names_;
  std::vector<DatabaseRecord> records_;
};

int AddFiles(const std::vector<SelectedFile>& files, uint32_t jobs, ThumbnailDatabase& database,
             ResultOutput& output, bool history) {
  const ThumbnailOptions options = ThumbnailOptionsFromSettings();
  Appending appending(database, output, history);
  std::vector<Adding> addings(files.size());
  std::atomic<bool> goesOn = true;
  OrderedRun run({
      .work =
          [&](size_t item) {
            const FolderScope folder(files[item].name);
            addings[item] = MakeRecord(files[item], options);
            return Status::Ok;
          },
      .deliver =
          [&](size_t item, Status status) {
            if (status != Status::Ok) addings[item].status = status;
            appending.Add(files[item], addings[item]);
            addings[item].record.reset();
            output.ShowProgress(item + 1, files.size());
            goesOn = output.GoesOn();
          },
      .goesOn = [&] { return goesOn && platform::PendingExit() == 0; },
      .tick = [&] { output.Tick(); },
  });
  run.Run(files.size(), jobs);
  appending.Flush();
  return output.Finish();
}

int RunAdd(const TdbOptions& options, CommandContext& context) {
  const std::string path = context.names.values[0];
  context.names.values.erase(context.names.values.begin());
  const auto selection = SelectFiles(options.selection, context);
  if (!selection) return kExitUsage;
  ResultOutput output(context, options.json);
  output.CloseWith(selection->leftOut);
  output.KeepGoing();
  if (options.dryRun) {
    for (const SelectedFile& file : selection->files) {
      if (file.status != Status::Ok) {
        output.FileFailed(file.name, file.status, file.hint);
        continue;
      }
      output.FileDone(file.name);
    }
    return output.Finish();
  }
  ThumbnailDatabase database;
  if (!OpenDatabase(database, path, Access::Create, output)) return output.Finish();
  const uint32_t jobs =
      options.jobs == 0 ? platform::CoreCount() : static_cast<uint32_t>(options.jobs);
  return AddFiles(selection->files, jobs, database, output, !context.global.noHistory);
}

int RunFind(const TdbOptions& options, CommandContext& context) {
  const std::string &path = context.names.values[0], &name = context.names.values[1];
  ResultOutput output(context, options.json);
  ThumbnailDatabase database;
  if (!OpenDatabase(database, path, Access::Read, output)) return output.Finish();
  const std::string picture = platform::AbsolutePath(name);
  ThumbnailRecord record;
  if (!database.Find(picture, VolumeKeyFor(picture), record, PictureStampOf(picture))) {
    const bool changed = database.Find(picture, VolumeKeyFor(picture), record);
    output.FileFailed(name, Status::NoImages, Tr(changed ? kNoCurrent : kNotFound));
    return output.Finish();
  }
  if (options.overwrite != "replace" && platform::FileExists(options.out)) {
    output.FileFailed(options.out, Status::ErrorCreatingFile, Tr(kExists));
    return output.Finish();
  }
  if (!WriteThumbnailFile(record, options.out, ThumbnailOptionsFromSettings().hidden)) {
    output.FileFailed(options.out, Status::ErrorCreatingFile, ReasonSentence());
    return output.Finish();
  }
  output.FileDone(name, options.out);
  return output.Finish();
}

void PrintJson(const CommandContext& context, const ThumbnailDatabase& database,
               const DatabaseHeader& header) {
  Json object{{"version", header.version},
              {"count", header.count},
              {"created", header.created},
              {"appended", header.appended}};
  object["records"] = Json::array();
  DatabaseKey key;
  for (int64_t i = 0; i < database.RecordCount(header); ++i) {
    if (!database.ReadKey(i, key)) continue;
    Json record{{"index", i}};
    PutName(record, "path", key.path);
    PutName(record, "volume", key.volume);
    record["deleted"] = key.deleted;
    record["modified"] = key.stamp.Known() ? Json(key.stamp.modified) : Json();
    object["records"].push_back(std::move(record));
  }
  const std::string text = object.dump(-1, ' ', true, Json::error_handler_t::replace) + "\n";
  std::fwrite(text.data(), 1, text.size(), context.io.out);
}

int RunList(const TdbOptions& options, CommandContext& context) {
  const std::string& path = context.names.values[0];
  ResultOutput output(context, false);
  ThumbnailDatabase database;
  DatabaseHeader header;
  if (!OpenDatabase(database, path, Access::Read, output)) return output.Finish();
  if (!database.ReadDatabaseHeader(header)) {
    output.Failure(path, Status::DamagedFile, Tr(kNoDatabase));
    return output.Finish();
  }
  if (header.count != database.RecordCount(header)) {
    output.Note(output.ShownMessage(path) + ": " +
                Tr("The header counts %1 records, but the file has %2.", header.count,
                   database.RecordCount(header)));
  }
  if (options.json) {
    PrintJson(context, database, header);
    return kExitOk;
  }
  DatabaseKey key;
  for (int64_t i = 0; i < database.RecordCount(header) && output.GoesOn(); ++i) {
    if (!database.ReadKey(i, key)) continue;
    output.Line(std::to_string(i) + "\t" + (key.deleted ? "deleted" : "live") + "\t" +
                output.Shown(key.volume) + "\t" + output.Shown(key.path));
  }
  return kExitOk;
}

// Counts the records that satisfy a test.
template <typename Test>
int64_t CountRecords(const ThumbnailDatabase& database, Test test) {
  DatabaseHeader header;
  DatabaseKey key;
  int64_t count = 0;
  const int64_t records = database.ReadDatabaseHeader(header) ? database.RecordCount(header) : 0;
  for (int64_t i = 0; i < records; ++i) count += database.ReadKey(i, key) && test(key);
  return count;
}

int RunDelete(const TdbOptions& options, CommandContext& context) {
  const std::string& path = context.names.values[0];
  ResultOutput output(context, options.json);
  ThumbnailDatabase database;
  if (!OpenDatabase(database, path, options.dryRun ? Access::Read : Access::Change, output))
    return output.Finish();
  for (size_t i = 1; i < context.names.values.size() && output.GoesOn(); ++i) {
    const std::string& name = context.names.values[i];
    const std::string picture = platform::AbsolutePath(name);
    const int64_t deleted = options.dryRun
                                ? CountRecords(database,
                                               [&](const DatabaseKey& key) {
                                                 return !key.deleted && key.path == picture;
                                               })
                                : database.Delete(picture);
    if (deleted < 1) {
      output.FileFailed(name, deleted == 0 ? Status::NoImages : Status::ErrorWritingFile,
                        deleted == 0 ? Tr(kNotFound) : "");
      continue;
    }
    output.FileDone(name);
  }
  return output.Finish();
}

class CompactionProgress : public ProgressSink {
 public:
  explicit CompactionProgress(ResultOutput& output) : output_(output) {}
  void Step(int32_t done, int32_t total) override {
    output_.ShowProgress(static_cast<uint64_t>(done), static_cast<uint64_t>(total));
  }

 private:
  ResultOutput& output_;
};

void ReportCompaction(ResultOutput& output, const std::string& path, int64_t before,
                      int64_t after) {
  if (!output.IsJson()) return output.Line(Tr("%1 -> %2 records", before, after));
  Json element;
  PutName(element, "database", path);
  element["before"] = before;
  element["after"] = after;
  output.Element(element);
}

int RunCompact(const TdbOptions& options, CommandContext& context) {
  const std::string& path = context.names.values[0];
  ResultOutput output(context, options.json);
  ThumbnailDatabase database;
  DatabaseHeader before, after;
  if (!OpenDatabase(database, path, options.dryRun ? Access::Read : Access::Change, output))
    return output.Finish();
  const bool read = database.ReadDatabaseHeader(before);
  if (options.dryRun) {
    const int64_t kept = CountRecords(database, [&](const DatabaseKey& key) {
      return !key.deleted &&
             !(options.purge && !platform::FileExists(key.path) && PurgesMissing(key));
    });
    ReportCompaction(output, path, before.count, kept);
    return kExitOk;
  }
  CompactionProgress progress(output);
  const ThumbnailDatabase::Compacted result =
      read ? database.CompactThumbnailDatabase(options.purge, &progress)
           : ThumbnailDatabase::Compacted::NotRead;
  if (result == ThumbnailDatabase::Compacted::Done && database.ReadDatabaseHeader(after)) {
    ReportCompaction(output, path, before.count, after.count);
    return kExitOk;
  }
  const Status status = result == ThumbnailDatabase::Compacted::NotRead ? Status::FileReadError
                        : result == ThumbnailDatabase::Compacted::Stopped
                            ? Status::FunctionCancelled
                            : Status::ErrorWritingFile;
  output.FileFailed(path, status, Tr("The database was left unchanged."));
  return kExitFailed;
}

using Run = int (*)(const TdbOptions& options, CommandContext& context);

std::shared_ptr<TdbOptions> SetUp(CLI::App& app, CommandContext& context, Run run,
                                  const char* notes, const char* example) {
  auto options = std::make_shared<TdbOptions>();
  SetFooter(app, notes, example);
  context.run = [options, &context, run] { return run(*options, context); };
  return options;
}

}  // namespace

void SetUpTdbAdd(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunAdd,
                             TrLater("The database is created if needed. If it already has the "
                                     "picture, the earlier record is\n"
                                     "marked as deleted."),
                             "fotomill tdb add Fotomill.tdb holiday --recursive");
  AddSelection(app, options->selection, context);
  context.names.Declare("DB FILE...", "The database, and picture files or folders of pictures", 1);
  AddNumber(app, "-j,--jobs", options->jobs, "N", 0, 256,
            "Number of parallel jobs (default: 0, one per core)");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be added");
  AddFlag(app, "--json", options->json, "Print a JSON array of {file, status, message}");
}

void SetUpTdbFind(CLI::App& app, CommandContext& context) {
  const auto options = SetUp(app, context, RunFind, nullptr,
                             "fotomill tdb find Fotomill.tdb holiday/beach.jpg --out beach.THN");
  context.names.Declare("DB PATH", "The database, and the path of a picture", 2, 2);
  Require(AddName(app, "-o,--out", options->out, "FILE.THN", "Thumbnail file to write"));
  AddChoice(app, "--overwrite", options->overwrite, "HOW",
            "If the output exists: refuse (default) or replace", {"refuse", "replace"});
  AddFlag(app, "--json", options->json,
          "Print a JSON array of {file, destination, status, message}");
}

void SetUpTdbList(CLI::App& app, CommandContext& context) {
  const auto options =
      SetUp(app, context, RunList, nullptr, "fotomill tdb list Fotomill.tdb --json");
  context.names.Declare("DB", "The database", 1, 1);
  AddFlag(app, "--json", options->json,
          "Print a JSON object {version, count, created, appended, records: [{index, path, volume, "
          "deleted, modified}]}");
}

void SetUpTdbDelete(CLI::App& app, CommandContext& context) {
  const auto options =
      SetUp(app, context, RunDelete,
            TrLater("Records are only marked as deleted; \"tdb compact\" removes them."),
            "fotomill tdb delete Fotomill.tdb holiday/beach.jpg");
  context.names.Declare("DB PATH...", "The database, and paths of pictures", 2);
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show what would be deleted");
  AddFlag(app, "--json", options->json, "Print a JSON array of {file, status, message}");
}

void SetUpTdbCompact(CLI::App& app, CommandContext& context) {
  const auto options =
      SetUp(app, context, RunCompact, nullptr, "fotomill tdb compact Fotomill.tdb --purge");
  context.names.Declare("DB", "The database", 1, 1);
  AddFlag(app, "--purge", options->purge,
          "Also remove thumbnails of missing pictures, except on network, optical and removable drives");
  AddFlag(app, "-n,--dry-run", options->dryRun, "Only show how many records would remain");
  AddFlag(app, "--json", options->json, "Print a JSON array of {database, before, after}");
}

}  // namespace fotomill::cli
