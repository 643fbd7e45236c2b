#include <fmt/format.h>

#include <algorithm>
#include <filesystem>
#include <memory>
#include <optional>
#include <vector>

#include "cli/frame/each_photo.h"
#include "cli/frame/errors.h"
#include "cli/frame/face_choice.h"
#include "cli/frame/file_bytes.h"
#include "cli/frame/interrupt.h"
#include "cli/frame/jobs_option.h"
#include "cli/frame/json_output.h"
#include "cli/frame/limits.h"
#include "cli/frame/lone_files.h"
#include "cli/frame/memory_option.h"
#include "cli/frame/photo_files.h"
#include "cli/frame/raw_option.h"
#include "cli/pictures/canvas.h"
#include "cli/pictures/face_frames.h"
#include "cli/pictures/sheet_painter.h"
#include "cli/verbs/sheet_columns.h"
#include "cli/verbs/verbs.h"
#include "image_processing/filters/pass_through.h"
#include "photo/area_average.h"
#include "photo/turn.h"

namespace pelorin::cli {

using image_processing::Image;
using image_processing::RGBA8Pixel;

namespace {

using image_processing::ImageMetadata;
using image_processing::PassThrough;

struct SheetOptions {
  InputOptions inputs;
  LoneOutputOptions outputs;
  ReportOptions report;
  SheetColumnOptions columns;
  FaceOptions faces;
  std::string raw;
  std::optional<std::string> title;
  std::uint32_t cell = 320;
  int quality = 90;
  int jobs = 0;
  int memory = usualMemory;
};

/// What one photo contributes.
struct SheetRow {
  std::string label;
  std::vector<Image<RGBA8Pixel>> thumbnails;
};

struct SheetWork {
  std::vector<SheetColumn> columns;
  FaceChoice faces;
  photo::OpenOptions photo;
};

/// Room for the photo's thumbnails. What cannot be known before the photo is decoded (standard
/// input can be read only once) gets a whole cell, and what cannot be read at all a low strip.
photo::PictureSize roomFor(const Input& input, const photo::OpenOptions& options,
                           std::uint32_t cell) {
  const photo::PictureSize box{cell, cell};
  if (options.raw) return photo::fitWithin({options.raw->width, options.raw->height}, box);
  if (input.isStandardInput()) return box;
  if (!input.trouble.empty()) return {cell, cell / 4};
  try {
    const photo::PhotoFacts facts = photo::readFacts(readInput(input), limits().decode);
    const bool onItsSide = photo::uprightTurn(facts.orientation).quarters % 2 != 0;
    const photo::PictureSize stored{facts.width, facts.height};
    return photo::fitWithin(onItsSide ? photo::PictureSize{stored.height, stored.width} : stored,
                            box);
  } catch (const Interrupted&) {
    throw;
  } catch (const std::exception&) {
    return {cell, cell / 4};  // the reason is said when its turn comes
  }
}

/// A small picture of rows.
class Thumbnail : public image_processing::RowSink {
 public:
  Thumbnail(photo::PictureSize picture, photo::PictureSize size)
      : width_(picture.width), average_(picture, size) {}

  void write(const RGBA8Pixel* rows, std::uint32_t count) override {
    for (std::uint32_t i = 0; i < count; ++i) average_.addRow(rows + std::size_t{width_} * i);
  }
  const Image<RGBA8Pixel>& picture() const { return average_.result(); }

 private:
  std::uint32_t width_;
  photo::AreaAverage average_;
};

Image<RGBA8Pixel> filteredThumbnail(photo::PhotoRows& photo, image_processing::RowFilter& filter,
                                    photo::PictureSize size) {
  const image_processing::RowWork work{
      .stop = [stop = interruptToken()] { return stop.stop_requested(); }};
  if (filter.looksFirst()) filter.look(photo.sweep(/*again=*/true), work);
  stopIfInterrupted();
  Thumbnail thumbnail(photo.size(), size);
  filter.filter(photo.sweep(/*again=*/true), thumbnail, work);
  stopIfInterrupted();
  return thumbnail.picture();
}

SheetRow makeRow(const SheetWork& work, const Input& input, const photo::RowResources& resources,
                 photo::PictureSize room, Talk& talk) {
  const photo::OpenedFile file = openInput(input, work.photo);
  photo::PhotoRows photo(file.view(), limited(work.photo), resources);
  const photo::PictureSize size = photo.size();
  const photo::PictureSize small = photo::fitWithin(size, room);
  const std::string name = input.isStandardInput()
                               ? input.shownName()
                               : std::filesystem::path(input.path).filename().string();
  SheetRow row{fmt::format("{}  \xC2\xB7  {} \xC3\x97 {}", name, size.width, size.height), {}};
  const ImageMetadata faces =
      metadataWithFaces(allFaces(work.faces.of(input), photo.faces()), size.width, size.height);
  const auto unfiltered = PassThrough::forRows({size.width, size.height});
  row.thumbnails.push_back(filteredThumbnail(photo, *unfiltered, small));
  frameFaces(row.thumbnails.front(), faces, size);
  for (const SheetColumn& column : work.columns) {
    const auto filter =
        column.filter->makeRowFilter({.width = size.width,
                                      .height = size.height,
                                      .metadata = column.faces ? faces : ImageMetadata{},
                                      .params = column.params});
    row.thumbnails.push_back(filteredThumbnail(photo, *filter, small));
  }
  tellNotices(input, photo.facts(), talk);
  return row;
}

SheetPlan planOf(const SheetOptions& options, const SheetWork& work,
                 const std::vector<Input>& inputs) {
  SheetPlan plan{options.title.value_or(titleOf(work.columns)), {"Original"}, {}};
  for (const SheetColumn& column : work.columns) plan.columnLabels.push_back(column.label);
  for (const Input& input : inputs) {
    stopIfInterrupted();
    plan.thumbnailSizes.push_back(roomFor(input, work.photo, options.cell));
  }
  return plan;
}

ExitCode runSheet(const SheetOptions& options) {
  SheetWork work{sheetColumns(options.columns), FaceChoice(options.faces), {}};
  const bool facesMatter = std::ranges::any_of(work.columns, [](const SheetColumn& column) {
    return column.filter->parameters().readsFaces;
  });
  if (work.faces.areNamed() && !facesMatter)
    throw UsageError("--face: has no effect on these looks");
  work.photo.faces = work.faces.asksPhoto();
  work.photo.raw = readRawSize(options.raw, options.inputs);
  const std::string& output = options.outputs.output;
  requireFormatOf(output, /*raw=*/false);
  const std::vector<Input> inputs = expandInputs(options.inputs);
  JsonOutput json(options.report, true);
  if (output == "-" && json.wanted()) {
    throw UsageError("-o -: standard output takes the sheet or --json, not both");
  }
  Talk talk("sheet", options.report, inputs.size());
  if (inputs.empty()) {
    talk.note("no photos found");
    return ExitCode::nothingToDo;
  }
  if (const auto code = stopBeforeWork(inputs, {output}, options.outputs, talk, json)) return *code;

  const SheetPainter painter(planOf(options, work, inputs));
  if (!painter.fits()) {
    throw UsageError(fmt::format(
        "the sheet would be {} x {} pixels, above {} x {}; name fewer photos or looks, or a "
        "smaller --cell",
        painter.width(), painter.height(), Canvas::largestSide, SheetPainter::greatestHeight));
  }
  const auto writer =
      outputFormat(output, {})
          .writer({static_cast<std::uint32_t>(painter.width()),
                   static_cast<std::uint32_t>(painter.height())},
                  /*hasAlpha=*/false,
                  // Thin text is a large part of the picture.
                  {.quality = options.quality, .colour = photo::ColourDetail::full}, {});
  const auto add = [&](const Image<RGBA8Pixel>& band) {
    writer->write(band.data.get(), band.height);
  };
  add(painter.heading());
  Json rows = Json::array();
  KeptPixels pixels(options.memory, options.jobs, inputs.size());
  const PhotoTally tally = eachPhoto<SheetRow>(
      inputs, options.jobs, talk,
      {.work =
           [&](std::size_t index) {
             const KeptPixels::Lent lent(pixels);
             return makeRow(work, inputs[index], lent.resources(), painter.thumbnailSize(index),
                            talk);
           },
       .done =
           [&](std::size_t index, const SheetRow& row) {
             add(painter.row(index, row.label, row.thumbnails));
             rows.push_back({{"input", inputs[index].path}, {"status", "done"}});
           },
       .failed =
           [&](std::size_t index, const std::string& reason) {
             add(painter.row(index, inputs[index].shownName(), {}, reason));
             rows.push_back(
                 {{"input", inputs[index].path}, {"status", "failed"}, {"error", reason}});
           }});
  if (tally.interrupted) {
    talk.note("interrupted; no sheet was made");
    return ExitCode::interrupted;
  }
  const bool something = tally.done > 0;
  if (something) writeOutput(output, writer->finish({}), {.mayReplace = options.outputs.overwrite});
  json.add({{"output", output},
            {"status", something ? "done" : "failed"},
            {"width", painter.width()},
            {"height", painter.height()},
            {"photos", rows}});
  return tally.exitCode(talk);
}

}  // namespace

void addSheet(CommandLine& commandLine) {
  const auto options = std::make_shared<SheetOptions>();
  Verb verb =
      commandLine.addVerb("sheet", "One labelled picture of photos beside their enhanced versions",
                          "quenby sheet *.jpg -o sheet.jpg\n"
                          "quenby sheet -r holiday -o sheet.jpg --looks Auto,Winter\n"
                          "quenby sheet photo.jpg -o sliders.jpg --sliders 0,0.3,0.6,1\n"
                          "quenby sheet photo.jpg -o faces.jpg --sliders 0.7 --without-faces\n",
                          [options] { return runSheet(*options); });
  addInputOptions(verb, options->inputs);
  addSheetColumnOptions(verb, options->columns);
  addFaceOptions(verb, options->faces);
  addLoneOutputOptions(
      verb, options->outputs, "FILE",
      "The " + photo::pictureExtensions() + " file for the sheet, or - (standard output)");
  verb.named("--output").required();
  verb.option("--title", options->title, "What stands above the sheet")
      .type("TEXT")
      .group("Output");
  verb.option("--cell", options->cell,
              "Longest side of a small picture in pixels; 320 unless given")
      .between(32, 4096)
      .group("Output");
  addQualityOption(verb, options->quality);
  addRawOption(verb, options->raw);
  addJobsOption(verb, options->jobs);
  addMemoryOption(verb, options->memory);
  addReportOptions(verb, options->report);
}

}  // namespace pelorin::cli
