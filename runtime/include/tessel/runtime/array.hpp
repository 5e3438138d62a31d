// tessel/runtime/array.hpp: host arrays as a program that embeds the host makes and reads them.
#pragma once

#include "tessel/array.h"

#include <cstddef>
#include <initializer_list>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace tessel {

/// The dimensions of an array, first dimension fastest.
using Dims = std::span<const std::size_t>;

/// The size in bytes of one element of a class; 0 for classes without plain data.
std::size_t elementSize(tsClassID classID) noexcept;

/// Owns one host array, or none. Moves, does not copy.
///
/// Data are column-major. Every maker raises Error "TESSEL:host:outOfMemory" when there is no
/// memory, "TESSEL:host:dimensionsTooLarge" when the size overflows, "TESSEL:host:badDimensions"
/// without any dimension, and "TESSEL:host:badClass" for a class that it does not make. One
/// dimension of length n makes n-by-1. Any thread may use any array, one thread at a time.
class Array {
  public:
    Array() noexcept = default;

    /// A numeric array whose elements have no defined values yet; with `complex`, it has imaginary
    /// parts as well, in storage of their own.
    static Array numeric(tsClassID classID, Dims dims, bool complex = false);

    /// A logical array, all false.
    static Array logical(Dims dims);

    /// A char array, all of the character 0.
    static Array characters(Dims dims);

    /// A cell array without a value in any position.
    static Array cell(Dims dims);

    /// A 1-by-1 double.
    static Array scalar(double value);

    /// A 1-by-n double row.
    static Array row(std::initializer_list<double> values);

    /// A 1-by-n row of characters made from UTF-8; a byte that is not part of valid UTF-8 becomes
    /// the character of the same code. "" gives 1-by-0.
    static Array text(std::string_view utf8);

    /// A structure array with the given fields; each element's value of each field is set with
    /// setCell, at position element * number of fields + field.
    static Array structure(Dims dims, std::vector<std::string> fields);

    /// A handle of the function of that name.
    static Array function(std::string_view name);

    /// An array of the class "unknown", without data.
    static Array unknown(Dims dims);

    /// An array of a numeric class, logical or char over memory of somebody else's, which stays
    /// alive and unmoved as long as `lender` does and must be aligned for the class. Not copied.
    static Array borrowed(tsClassID classID, Dims dims, void *data, std::shared_ptr<void> lender);

    /// Takes over an array that nobody else owns.
    static Array adopt(tsArray *array) noexcept;

    /// Whether there is an array.
    [[nodiscard]] explicit operator bool() const noexcept { return array != nullptr; }

    /// The array as the host interface takes it, owned as before; nullptr where there is none.
    [[nodiscard]] const tsArray *get() const noexcept { return array.get(); }

    /// The same, to be changed.
    [[nodiscard]] tsArray *get() noexcept { return array.get(); }

    /// Gives the array away, to one who adopts it or hands it to the host; nullptr where there is
    /// none. There is none afterwards.
    [[nodiscard]] tsArray *release() noexcept { return array.release(); }

    // What follows wants an array to be there.

    /// The class.
    [[nodiscard]] tsClassID classID() const noexcept;

    /// The name of the class: "double", "int32", "char" and so on; it lives as long as the program.
    [[nodiscard]] const char *className() const noexcept;

    /// The lengths of the dimensions, at least two, first dimension fastest; valid as long as the
    /// array lives.
    [[nodiscard]] Dims dims() const noexcept;

    /// The number of elements.
    [[nodiscard]] std::size_t size() const noexcept;

    /// The real data; nullptr where there are none.
    [[nodiscard]] void *data() const noexcept;
    /// The imaginary parts; nullptr for a real array.
    [[nodiscard]] void *imaginary() const noexcept;

    /// The elements as a T of the element size of the class; Error "TESSEL:host:badClass"
    /// otherwise.
    template <class T>
    [[nodiscard]] std::span<T> elements() const {
        wantElementSize(sizeof(T));
        return {static_cast<T *>(data()), size()};
    }

    /// The first element of a numeric array as a double; Error "TESSEL:host:badClass" when the
    /// class is not numeric or there is no element.
    [[nodiscard]] double number() const;

    /// The characters of a char array or the name of a function handle, as UTF-8.
    [[nodiscard]] std::string utf8() const;

    /// The value at a position of a cell or structure array; empty where nothing was set. Error
    /// "TESSEL:host:badIndex" beyond the end, "TESSEL:host:badClass" for other classes.
    [[nodiscard]] const Array &cellAt(std::size_t index) const;

    /// Sets it, in the place of what was there. The same errors.
    void setCell(std::size_t index, Array value);

    /// The names of a structure's fields.
    [[nodiscard]] const std::vector<std::string> &fields() const;

  private:
    struct Destroy {
        void operator()(tsArray *owned) const noexcept;
    };

    explicit Array(tsArray *owned) noexcept : array(owned) {}
    void wantElementSize(std::size_t size) const;

    std::unique_ptr<tsArray, Destroy> array;
};

/// The characters of a char array as UTF-8; Error "TESSEL:host:badClass" for other classes.
std::string utf8Of(const tsArray *characters);

} // namespace tessel
