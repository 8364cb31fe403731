#include "Run.h"

#include <algorithm>
#include <chrono>
#include <new>
#include <optional>
#include <system_error>

#include "Photo.h"
#include "Pipeline.h"
#include "Progress.h"
#include "Source.h"
#include "Writer.h"

namespace app {

namespace {

constexpr std::size_t kLargestBatch = 64;
// A batch is to be short enough for the output to flow and long enough to be worth handing over.
constexpr double kLongBatch = 0.002;
constexpr std::size_t kWideBatch = std::size_t{1} << 20;

/// One run over the files of a source.
class Runner {
 public:
  Runner(Options const& options, Output& output, Console& console);

  int run();

 private:
  int runSource(Source& source);
  std::unique_ptr<Batch> nextBatch(Source& source) const;
  void work(Batch& batch) const;
  void emitOldest();
  void emit(Outcome&& outcome);
  void emitAll();
  int end();
  void report(std::string const& path, std::string const& problem, bool isFailure);

  Options const& options_;
  Output& output_;
  Console& console_;
  std::unique_ptr<Writer> writer_;
  Progress progress_;
  Pipeline pipeline_;
  std::size_t batchSize_ = 1;
  bool missedPhotos_ = false;
};

Runner::Runner(Options const& options, Output& output, Console& console)
    : options_(options),
      output_(output),
      console_(console),
      writer_(makeWriter(options, output)),
      progress_(console, options),
      pipeline_(options.jobs, options.cachedJobs, [this](Batch& batch) { work(batch); }) {}

int Runner::run() {
  if (options_.fromStdin) {
    Outcome outcome = readStandardInput(options_.extension);
    writer_->prepareSafely(outcome);
    emit(std::move(outcome));
    return end();
  }
  std::optional<Source> source;
  try {
    source.emplace(options_, [this](std::string const& path, std::string const& problem,
                                    bool isFailure) { report(path, problem, isFailure); });
  } catch (std::system_error const& error) {
    console_.sayOf(options_.filesFrom, "the list cannot be opened: " + error.code().message());
    return kWrongUsage;
  }
  return runSource(*source);
}

int Runner::runSource(Source& source) {
  while (true) {
    if (!source.isReady()) {
      emitAll();
      writer_->pause();
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
  Input input;
  while (batch->inputs.size() < batchSize_ && (batch->inputs.empty() || source.isReady()) &&
         source.next(input)) {
    batch->inputs.push_back(std::move(input));
  }
  return batch;
}

void Runner::work(Batch& batch) const {
  auto const start = std::chrono::steady_clock::now();
  batch.outcomes.reserve(batch.inputs.size());
  for (auto& input : batch.inputs) {
    Outcome outcome = readPhoto(std::move(input));
    writer_->prepareSafely(outcome);
    batch.bytes += outcome.text.size();
    batch.outcomes.push_back(std::move(outcome));
  }
  batch.seconds = std::chrono::duration<double>(std::chrono::steady_clock::now() - start).count();
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
  bool const isLarge = batch->seconds > kLongBatch || batch->bytes > kWideBatch;
  batchSize_ =
      isLarge ? std::max<std::size_t>(batchSize_ / 2, 1) : std::min(batchSize_ * 2, kLargestBatch);
}

void Runner::emit(Outcome&& outcome) {
  progress_.count(outcome.error.empty());
  if (!outcome.error.empty() && !(options_.isQuiet && options_.isMachineForm())) {
    console_.sayOf(outcome.path, outcome.error);
  }
  writer_->add(std::move(outcome));
}

int Runner::end() {
  writer_->end();
  output_.flush();
  console_.hideProgress();
  progress_.sumUp();
  return progress_.failures() > 0 || missedPhotos_ ? kSomeFailed : kSuccess;
}

void Runner::report(std::string const& path, std::string const& problem, bool isFailure) {
  console_.sayOf(path, problem);
  missedPhotos_ = missedPhotos_ || isFailure;
}

}  // namespace

int run(Options const& options, Output& output, Console& console) {
  return Runner(options, output, console).run();
}

}  // namespace app
