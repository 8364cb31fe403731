#include "Run.h"

#include <algorithm>
#include <chrono>
#include <memory>
#include <optional>
#include <system_error>
#include <utility>

#include "Pipeline.h"
#include "Progress.h"
#include "input/Source.h"
#include "output/Writer.h"
#include "photo/Photo.h"

namespace app {

namespace {

class Runner {
 public:
  Runner(Options const& options, Output& output, Console& console);

  int run();

 private:
  int runSource(Source& source);
  std::unique_ptr<Batch> nextBatch(Source& source) const;  // begins to wait for its first file only
  void work(Batch& batch) const;
  void prepare(Outcome& outcome) const;
  void emitOldest();
  void emit(Outcome&& outcome);
  void emitAll();
  int end();

  Options const& options_;
  Output& output_;
  Console& console_;
  std::unique_ptr<Writer> writer_;
  Detail detail_;
  Progress progress_;
  Pipeline pipeline_;  // destroyed before the members above, which its threads use
  std::size_t batchSize_ = 1;
  bool isErrorHintDue_;  // it is to be said that the CSV has no `error` (JSON always has)
};

Runner::Runner(Options const& options, Output& output, Console& console)
    : options_(options),
      output_(output),
      console_(console),
      writer_(makeWriter(options.form, output)),
      detail_(options.form.hasNotes ? Detail::All : Detail::Refusals),
      progress_(console, options),
      pipeline_(options.diskJobs, options.processorJobs, [this](Batch& batch) { work(batch); }),
      isErrorHintDue_(options.form.kind == FormKind::Csv && !options.form.fields.empty() &&
                      !contains(options.form.fields, "error")) {}

int Runner::run() {
  if (options_.fromStdin) {
    Outcome outcome = readStandardInput(options_.extension, detail_);
    prepare(outcome);
    emit(std::move(outcome));
    return end();
  }
  std::optional<Source> source;
  try {
    source.emplace(options_.inputs, [this](std::string const& path, std::string const& remark) {
      console_.printFileMessage(path, remark);
    });
  } catch (std::system_error const& error) {
    console_.printFileMessage(options_.inputs.list,
                              "the list cannot be opened: " + error.code().message());
    return kWrongUsage;
  }
  return runSource(*source);
}

int Runner::runSource(Source& source) {
  while (true) {
    if (!source.isReady()) {  // show all there is while the next path is awaited
      emitAll();
      writer_->writeHeldBack();
      output_.flush();
    }
    auto batch = nextBatch(source);
    if (batch->inputs.empty()) {
      break;
    }
    pipeline_.submit(std::move(batch));
    while (pipeline_.isFull() || pipeline_.isOldestDone()) {
      emitOldest();
    }
  }
  emitAll();
  return end();
}

std::unique_ptr<Batch> Runner::nextBatch(Source& source) const {
  auto batch = std::make_unique<Batch>();
  batch->inputs.reserve(batchSize_);
  Input input;
  while (source.next(input)) {
    batch->inputs.push_back(std::move(input));
    if (batch->inputs.size() >= batchSize_ || !source.isReady()) {
      break;
    }
  }
  return batch;
}

void Runner::work(Batch& batch) const {
  auto const start = std::chrono::steady_clock::now();
  batch.outcomes.reserve(batch.inputs.size());
  for (auto& input : batch.inputs) {
    Outcome& outcome = batch.outcomes.emplace_back(readPhoto(std::move(input), detail_));
    prepare(outcome);
    batch.bytes += outcome.text.size();
  }
  batch.seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
}

void Runner::prepare(Outcome& outcome) const {
  Form const& form = options_.form;
  // People get tidy dates; programs get those of the file, unless they ask for ISO 8601.
  if (outcome.record && (form.hasIsoDates || !form.isData())) {
    tidyDates(*outcome.record, /*asIso=*/form.hasIsoDates);
  }
  outcome.isShown = std::all_of(form.conditions.begin(), form.conditions.end(),
                                [&](Condition const& each) { return each.holds(outcome); });
  if (outcome.isShown) {
    writer_->prepareOrSetProblem(outcome);
  }
}

void Runner::emitAll() {
  while (!pipeline_.isEmpty()) {
    emitOldest();
  }
}

void Runner::emitOldest() {
  auto const batch = pipeline_.take();
  for (auto& outcome : batch->outcomes) {
    emit(std::move(outcome));
  }
  output_.flush();
  progress_.tick();
  batchSize_ = nextBatchSize(*batch, batchSize_);
}

void Runner::emit(Outcome&& outcome) {
  Form const& form = options_.form;
  // Not `outcome.record`, which the writer's `prepare` may have dropped.
  progress_.count(/*hasRecord=*/!outcome.problem, outcome.isShown);
  // The message is dropped if the output shows the file and tells the reason. The text of --why
  // does. JSON and CSV do so in the field `error`, but people may want the message too unless
  // --quiet is given; it then drops the message even if --fields leaves `error` out.
  bool const isMessageDropped = form.isData() ? options_.isQuiet : form.isExplanation();
  if (outcome.problem && !(outcome.isShown && isMessageDropped)) {
    console_.printFileMessage(outcome.path, outcome.problem.text);
  }
  if (outcome.problem && outcome.isShown && isErrorHintDue_) {
    isErrorHintDue_ = false;
    console_.printMessage(
        "the rows of files without a record do not say why: add error to --fields");
  }
  if (outcome.isShown) {
    writer_->add(std::move(outcome));
  }
}

int Runner::end() {
  writer_->end();
  output_.flush();
  console_.hideProgress();
  progress_.sumUp();
  return progress_.failures() > 0 ? kSomeFailed : kSuccess;
}

}  // namespace

int run(Options const& options, Output& output, Console& console) {
  return Runner(options, output, console).run();
}

}  // namespace app
