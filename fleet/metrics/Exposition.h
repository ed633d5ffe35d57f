// Figures in the text form of Prometheus (version 0.0.4).
#ifndef FLEET_METRICS_EXPOSITION_H
#define FLEET_METRICS_EXPOSITION_H

#include <cstdint>
#include <initializer_list>
#include <string>
#include <string_view>
#include <utility>

namespace fleet {

// Composes the text: call family(), then sample() for each sample of this family, then the next family().
// Used by one thread.
class Exposition {
  public:
    enum class Type : std::uint8_t { counter, gauge };
    using Labels = std::initializer_list<std::pair<std::string_view, std::string_view>>;

    // Begins a family. The caller sees to it that its name, and the names of labels, are valid for
    // Prometheus. `help` is one line.
    void family(std::string_view name, Type type, std::string_view help);
    // A sample of the last family. Values of labels may be any text.
    void sample(Labels labels, std::uint64_t value) { add(labels, std::to_string(value)); }
    void sample(Labels labels, double value);
    // A family with one sample and no labels.
    template <class Number>
    void single(std::string_view name, Type type, std::string_view help, Number value) {
        family(name, type, help);
        sample({}, value);
    }

    const std::string& text() const { return text_; }

  private:
    void add(Labels labels, std::string_view value);

    std::string name_;
    std::string text_;
};

}  // namespace fleet

#endif
