// Reads photos on a web server without downloading them: a request fetches a range of bytes, and
// the read-ahead keeps the requests few.
#include <curl/curl.h>
#include <quavel/quavel.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstring>
#include <iostream>
#include <stdexcept>

/// A photo at a URL. Every read is a request of its own. Throws when the server does not deliver
/// what it was asked for.
class HttpStream : public quavel::QVStream {
 public:
  /// `connection` is shared by all photos, so that it stays open from one to the next.
  HttpStream(CURL* connection, std::string const& url) : connection_(connection) {
    curl_easy_reset(connection);
    curl_easy_setopt(connection, CURLOPT_URL, url.c_str());
    curl_easy_setopt(connection, CURLOPT_PROTOCOLS_STR, "http,https");
    curl_easy_setopt(connection, CURLOPT_FOLLOWLOCATION, 1L);
    curl_easy_setopt(connection, CURLOPT_CONNECTTIMEOUT, 10L);
    curl_easy_setopt(connection, CURLOPT_LOW_SPEED_LIMIT, 500L);  // fewer bytes a second, for
    curl_easy_setopt(connection, CURLOPT_LOW_SPEED_TIME, 20L);    // so long: it has stalled
    curl_easy_setopt(connection, CURLOPT_HEADERFUNCTION, &HttpStream::takeHeader);
    curl_easy_setopt(connection, CURLOPT_HEADERDATA, this);
    curl_easy_setopt(connection, CURLOPT_WRITEFUNCTION, &HttpStream::takeBody);
    curl_easy_setopt(connection, CURLOPT_WRITEDATA, this);
  }

  std::int64_t readBuffer(std::uint8_t* destination, std::size_t count) override {
    if (count == 0 || (size_ != -1 && position_ >= size_)) {
      return 0;
    }
    answer_ = {destination, count};
    std::int64_t const last = position_ + static_cast<std::int64_t>(count) - 1;
    std::string const range = std::to_string(position_) + "-" + std::to_string(last);
    curl_easy_setopt(connection_, CURLOPT_RANGE, range.c_str());
    ++requests;
    CURLcode const code = curl_easy_perform(connection_);
    bytes += static_cast<std::int64_t>(answer_.received);
    if (status() == kBeyondTheEnd) {
      return 0;
    }
    checkAnswer(code);
    position_ += static_cast<std::int64_t>(answer_.received);
    return static_cast<std::int64_t>(answer_.received);
  }
  long getOffset() override { return static_cast<long>(position_ - baseOffset); }
  void setOffset(long const& offset) override {
    // Offsets come from the photo, so they may lead anywhere.
    if (baseOffset + offset >= 0) {
      position_ = baseOffset + offset;
    }
  }

  int requests = 0;
  std::int64_t bytes = 0;  // of the answers' bodies

 private:
  static constexpr long kPartialContent = 206;
  static constexpr long kBeyondTheEnd = 416;

  struct Answer {
    std::uint8_t* destination = nullptr;
    std::size_t room = 0;
    std::size_t received = 0;
    long long first = -1, last = -1, size = -1;  // of "Content-Range: bytes first-last/size"
    bool isTooLong = false;
  };

  long status() const {
    long result = 0;
    curl_easy_getinfo(connection_, CURLINFO_RESPONSE_CODE, &result);
    return result;
  }

  static std::size_t takeHeader(char const* line, std::size_t, std::size_t count, void* self) {
    constexpr char kName[] = "content-range:";
    std::string const text(line, count);
    if (curl_strnequal(text.c_str(), kName, sizeof(kName) - 1)) {
      Answer& answer = static_cast<HttpStream*>(self)->answer_;
      std::sscanf(text.c_str() + sizeof(kName) - 1, " bytes %lld-%lld/%lld", &answer.first,
                  &answer.last, &answer.size);
    }
    return count;
  }

  /// Ends the transfer, by taking nothing, when it is not a range or longer than asked for.
  static std::size_t takeBody(char const* data, std::size_t, std::size_t count, void* self) {
    auto& stream = *static_cast<HttpStream*>(self);
    Answer& answer = stream.answer_;
    answer.isTooLong = count > answer.room - answer.received;
    if (answer.isTooLong || stream.status() != kPartialContent) {
      return 0;
    }
    std::memcpy(answer.destination + answer.received, data, count);
    answer.received += count;
    return count;
  }

  void checkAnswer(CURLcode code) {
    long const number = status();
    if (number == 200) {
      throw std::runtime_error("the server does not serve byte ranges");
    }
    if (number != 0 && number != kPartialContent) {
      throw std::runtime_error("the server answers " + std::to_string(number));
    }
    if (answer_.isTooLong) {
      throw std::runtime_error("the server sends more than it was asked for");
    }
    if (code != CURLE_OK) {
      throw std::runtime_error(curl_easy_strerror(code));
    }
    auto const received = static_cast<long long>(answer_.received);
    if (answer_.first != position_ || answer_.last != position_ + received - 1) {
      throw std::runtime_error("the server sends another range than it says");
    }
    if (size_ != -1 && answer_.size != size_) {
      throw std::runtime_error("the photo has changed since the first request");
    }
    size_ = answer_.size;
  }

  CURL* connection_;
  std::int64_t position_ = 0;
  std::int64_t size_ = -1;  // of the photo; -1: not known
  Answer answer_;
};

/// Most photos have all metadata in the first block. Over a network, a request costs more than the
/// bytes that a larger block brings along.
constexpr std::size_t kFirstBlock = 16384;
constexpr std::size_t kNextBlock = 8192;

bool readPhoto(CURL* connection, std::string const& url) {
  quavel::QVReader const reader(nullptr, 0, "");  // no format, so it reads nothing by itself
  std::string extension = reader.getPathExtension(url.substr(0, url.find_first_of("?#")));
  std::transform(extension.begin(), extension.end(), extension.begin(),
                 [](unsigned char c) { return std::tolower(c); });
  auto const record = reader.createMetadata(extension);
  if (!record) {
    std::cerr << url << ": not a photo's extension\n";
    return false;
  }
  auto const source = std::make_shared<HttpStream>(connection, url);
  std::shared_ptr<quavel::QVStream> stream =
      std::make_shared<quavel::QVReadAheadStream>(source, kFirstBlock, kNextBlock);
  try {
    if (!record->read(stream)) {
      std::cerr << url << ": not a whole photo of its kind\n";
      return false;
    }
  } catch (std::runtime_error const& error) {
    std::cerr << url << ": " << error.what() << '\n';
    return false;
  }
  std::cout << url.substr(url.rfind('/') + 1) << ' ' << record->width << 'x' << record->height
            << ' ' << source->requests << " requests " << source->bytes << " bytes\n";
  return true;
}

int main(int argc, char** argv) {
  if (argc < 2) {
    std::cerr << "usage: http_photos URL...\n";
    return 2;
  }
  curl_global_init(CURL_GLOBAL_DEFAULT);
  CURL* const connection = curl_easy_init();
  if (connection == nullptr) {
    std::cerr << "http_photos: libcurl cannot be started\n";
    return 1;
  }
  bool isRead = true;
  for (int i = 1; i < argc; ++i) {
    isRead = readPhoto(connection, argv[i]) && isRead;
  }
  curl_easy_cleanup(connection);
  curl_global_cleanup();
  return isRead ? 0 : 1;
}
