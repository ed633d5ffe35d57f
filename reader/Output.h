// Writes a command's data to standard output or a file, through a buffer.
#ifndef READER_OUTPUT_H
#define READER_OUTPUT_H

#include <cstddef>
#include <string>
#include <string_view>

namespace reader {

// Gathers text and writes it in large pieces. Used by one thread.
class Output {
  public:
    // Standard output, which stays open.
    Output();

    // A file, created or emptied. Throws FileError.
    explicit Output(const std::string& path);

    // An open descriptor, which the caller closes; the name is for messages.
    Output(int descriptor, std::string name);

    // Does not flush: an output that is left by an exception may hold half a line.
    ~Output();

    Output(const Output&) = delete;
    Output& operator=(const Output&) = delete;

    // write() and flush() throw ReaderGone if a pipe has no reader any more, and FileError if the text cannot
    // be written.
    void write(std::string_view text) {
        if (text.size() >= largeText) {
            flush();
            writeThrough(text);
            return;
        }
        buffer_.append(text);
        if (buffer_.size() >= bufferLimit)
            flush();
    }
    void flush();

    bool isTerminal() const { return terminal_; }
    int descriptor() const { return descriptor_; }
    const std::string& name() const { return name_; }

  private:
    static constexpr std::size_t bufferLimit = 256UL * 1024;
    static constexpr std::size_t largeText = 64UL * 1024;  // worth a write of its own, to save a copy

    void writeThrough(std::string_view text);

    int descriptor_;
    bool ours_;
    bool terminal_;
    std::string name_;
    std::string buffer_;
};

}  // namespace reader

#endif
