#pragma once

namespace nimbo {

/// A library of the system that is opened when it is first used, not whenever the program starts, and then stays open.
class LazyLibrary {
 public:
  /// The address of a function, as a pointer to whatever function it is assigned to.
  class Symbol {
   public:
    explicit Symbol(void* address) : _address(address) {}
    template <class Function>
    operator Function*() const {
      return reinterpret_cast<Function*>(_address);
    }

   private:
    void* _address;
  };

  /// Opens the library of this name ("libcurl.so.4"). Throws std::runtime_error where there is none.
  explicit LazyLibrary(const char* name);

  /// Throws std::runtime_error for a name that the library does not have.
  Symbol operator[](const char* function) const;

 private:
  void* _handle;
};

}  // namespace nimbo
