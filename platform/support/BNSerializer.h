#pragma once
// A serializer: an object that writes itself to a BNSerializerWriteStream as one element with
// its children, and reads itself back from a BNSerializerReadStream.
//
// Writing. The caller asks for writeHeader, which opens the object's element (and sets its
// attributes), then writeBody, which writes the children, and then closes the element itself
// (BNSerializerWriteStream::closeElement). The boolean arguments are options that a
// serializer hands on to the serializers it writes; the stream does not read them.
//
// Reading. A serializer becomes the stream's handler by BNSerializerReadStream::pushHandler,
// usually from the parseElement of the handler below it, for the element being parsed:
//   parseBegin     at once, from pushHandler (a serializer pushes its scopes here)
//   parseElement   for each element below that element, in document order, before the
//                  element's children; its answer true skips the element's children
//   parseEnd       when that element ends; the stream then pops the scopes pushed since
//                  pushHandler, and the handler below takes over again
// The answers of parseBegin and parseEnd are the serializer's own report on its start and
// end: pushHandler hands parseBegin's answer back to its caller, and BNSerializerReadStream
// keeps parseEnd's answer of the last handler that ended; the stream acts on neither.
// The stream never owns a handler: a handler must live until its element ends.

#include <cstdint>
#include <string>

class BNSerializerWriteStream;
class BNSerializerReadStream;
class BNStreamElement;

// Where and why reading or writing a stream failed. Line and column count from 1; a failure
// that has no place in the text (a file that cannot be opened) has line and column 0.
struct BNSerializerError {
    uint64_t line = 0;
    uint64_t column = 0;
    std::string message;

    // "line 3, column 14: <message>", or the message alone without a place.
    std::string text() const;
};

class BNSerializer {
public:
    virtual ~BNSerializer() = default;

    virtual void writeHeader(BNSerializerWriteStream& stream, bool option) = 0;
    virtual void writeBody(BNSerializerWriteStream& stream, bool option1, bool option2,
                           bool option3) = 0;
    // A serializer that writes channels names here the channel factories its data needs.
    virtual void markFactoriesForSerialization() {}

    virtual bool parseBegin(BNSerializerReadStream& stream) = 0;
    virtual bool parseEnd(BNSerializerReadStream& stream) = 0;
    virtual bool parseElement(BNSerializerReadStream& stream, BNStreamElement& element) = 0;
    // False: the content of an element given to this handler is stripped of the white space
    // at its ends, and white space alone counts as no content.
    virtual bool readSignificantWhiteSpace() const { return false; }

protected:
    BNSerializer() = default;
    BNSerializer(const BNSerializer&) = default;
    BNSerializer& operator=(const BNSerializer&) = default;
};
