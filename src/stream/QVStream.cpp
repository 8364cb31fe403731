#include "quavel/QVStream.h"

#include "stream/Bytes.h"

namespace quavel {

using detail::reverseBytes;

namespace {

template <class Number>
void reverseUnlessHostOrderIs(ByteOrder order, QVStream const& stream, Number* number) {
  if (stream.hostOrder != order) {
    reverseBytes(number);
  }
}

template <class Number>
bool readNumber(QVStream& stream, Number* number) {
  auto* const bytes = reinterpret_cast<std::uint8_t*>(number);
  if (!detail::readExactly(stream, bytes, sizeof(Number))) {
    return false;
  }
  if constexpr (sizeof(Number) > 1) {
    if (detail::needsReversal(stream)) {
      reverseBytes(number);
    }
  }
  return true;
}

}  // namespace

QVStream::QVStream() : hostOrder(hostBytesOrder()), byteOrder(ByteOrder::BigEndian) {}

QVStream::~QVStream() = default;

ByteOrder QVStream::hostBytesOrder() const {
  unsigned short const one = 1;
  bool const lowByteFirst = *reinterpret_cast<unsigned char const*>(&one) == 1;
  return lowByteFirst ? ByteOrder::LittleEndian : ByteOrder::BigEndian;
}

bool QVStream::readChar(char* destination) { return readNumber(*this, destination); }
bool QVStream::readByte(unsigned char* destination) { return readNumber(*this, destination); }
bool QVStream::readSByte(signed char* destination) { return readNumber(*this, destination); }
bool QVStream::readShort(unsigned short* destination) { return readNumber(*this, destination); }
bool QVStream::readSShort(short* destination) { return readNumber(*this, destination); }
bool QVStream::readLong(unsigned int* destination) { return readNumber(*this, destination); }
bool QVStream::readSLong(int* destination) { return readNumber(*this, destination); }
bool QVStream::readFloat(float* destination) { return readNumber(*this, destination); }
bool QVStream::readDouble(double* destination) { return readNumber(*this, destination); }

void QVStream::swapS(unsigned short* value) const { reverseBytes(value); }
void QVStream::swapL(unsigned int* value) const { reverseBytes(value); }
void QVStream::swapLL(unsigned long long* value) const { reverseBytes(value); }

void QVStream::swapSLittleToHost(unsigned short* value) const {
  reverseUnlessHostOrderIs(ByteOrder::LittleEndian, *this, value);
}

void QVStream::swapLLittleToHost(unsigned int* value) const {
  reverseUnlessHostOrderIs(ByteOrder::LittleEndian, *this, value);
}

void QVStream::swapLLLitleToHost(unsigned long long* value) const {  // see QVStream.h
  reverseUnlessHostOrderIs(ByteOrder::LittleEndian, *this, value);
}

void QVStream::swapSBigToHost(unsigned short* value) const {
  reverseUnlessHostOrderIs(ByteOrder::BigEndian, *this, value);
}

void QVStream::swapLBigToHost(unsigned int* value) const {
  reverseUnlessHostOrderIs(ByteOrder::BigEndian, *this, value);
}

void QVStream::swapLLBigToHost(unsigned long long* value) const {
  reverseUnlessHostOrderIs(ByteOrder::BigEndian, *this, value);
}

}  // namespace quavel
