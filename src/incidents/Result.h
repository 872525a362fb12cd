#pragma once

#include <functional>
#include <memory>
#include <string>

#include "platform/foundation/Error.h"
#include "platform/foundation/Object.h"

namespace nimbo {

class Result;
using ResultRef = std::shared_ptr<const Result>;

/// The outcome of a fetch: a value or an error, exactly one of them. Immutable; any thread may read it.
class Result : public Object {
 public:
  using ValueBlock = std::function<void(const ObjectRef& value)>;
  using ErrorBlock = std::function<void(const ErrorRef& error)>;

  static ResultRef resultWithValue(ObjectRef value) { return initWithSuccess(std::move(value)); }
  static ResultRef resultWithError(ErrorRef error) { return initWithError(std::move(error)); }
  /// Throws std::invalid_argument for a null value.
  static ResultRef initWithSuccess(ObjectRef value);
  /// Throws std::invalid_argument for a null error.
  static ResultRef initWithError(ErrorRef error);

  bool isSuccess() const { return _isSuccess; }

  /// Calls the block for what the result holds, at most one, before it returns. A missing block is a mistake that is
  /// logged.
  void withValue_orError(const ValueBlock& valueBlock, const ErrorBlock& errorBlock) const;

  /// A success of what `block` makes of the value (null throws std::invalid_argument); an error result answers itself.
  ResultRef map(const std::function<ObjectRef(const ObjectRef& value)>& block) const;
  /// What `block` answers for the value; an error result answers itself.
  ResultRef flatMap(const std::function<ResultRef(const ObjectRef& value)>& block) const;

  bool isEqualToResult(const Result& other) const;

  std::string_view className() const override { return "Result"; }
  bool isEqual(const Object* other) const override;
  std::uint64_t hash() const override;
  std::string description() const override;

 protected:
  Result(ObjectRef value, ErrorRef error, bool isSuccess)
      : _value(std::move(value)), _error(std::move(error)), _isSuccess(isSuccess) {}

 private:
  static std::string _errorMessageForValue_error(bool valueBlockMissing, bool errorBlockMissing);
  ResultRef self() const { return std::static_pointer_cast<const Result>(shared_from_this()); }

  ObjectRef _value;
  ErrorRef _error;
  bool _isSuccess;
};

}  // namespace nimbo
