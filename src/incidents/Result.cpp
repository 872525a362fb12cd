#include "incidents/Result.h"

#include <stdexcept>
#include <typeinfo>

#include "platform/foundation/Hash.h"
#include "platform/foundation/Log.h"

namespace nimbo {

namespace {
constexpr LogFacility kResultLogFacility{kDefaultLogSubsystem, "Result"};
}

ResultRef Result::initWithSuccess(ObjectRef value) {
  if (!value) throw std::invalid_argument("Value cannot be nil");
  return ResultRef(new Result(std::move(value), nullptr, true));
}

ResultRef Result::initWithError(ErrorRef error) {
  if (!error) throw std::invalid_argument("Error cannot be nil");
  return ResultRef(new Result(nullptr, std::move(error), false));
}

std::string Result::_errorMessageForValue_error(bool valueBlockMissing, bool errorBlockMissing) {
  std::string message = "Neither block can be nil but ";
  if (valueBlockMissing && errorBlockMissing)
    message += "both are nil.";
  else
    message += valueBlockMissing ? "value block is nil." : "error block is nil.";
  return message;
}

void Result::withValue_orError(const ValueBlock& valueBlock, const ErrorBlock& errorBlock) const {
  if (!valueBlock || !errorBlock)
    writeLog(kResultLogFacility, LogLevel::error, "%@", {_errorMessageForValue_error(!valueBlock, !errorBlock)});
  if (valueBlock && _value) {
    valueBlock(_value);
  } else if (errorBlock && _error) {
    errorBlock(_error);
  } else {
    if (!valueBlock && _value) writeLog(kResultLogFacility, LogLevel::error, "Had a value but no value block");
    if (!errorBlock && _error) writeLog(kResultLogFacility, LogLevel::error, "Had an error but no error block");
  }
}

ResultRef Result::map(const std::function<ObjectRef(const ObjectRef&)>& block) const {
  return _isSuccess ? resultWithValue(block(_value)) : self();
}

ResultRef Result::flatMap(const std::function<ResultRef(const ObjectRef&)>& block) const {
  return _isSuccess ? block(_value) : self();
}

bool Result::isEqual(const Object* other) const {
  if (this == other) return true;
  // Exactly this class: a subclass may mean more than it compares here.
  if (!other || typeid(*other) != typeid(Result)) return false;
  return isEqualToResult(static_cast<const Result&>(*other));
}

bool Result::isEqualToResult(const Result& other) const {
  if (_isSuccess != other._isSuccess) return false;
  bool equal = false;
  other.withValue_orError([&](const ObjectRef& value) { equal = value->isEqual(_value.get()); },
                          [&](const ErrorRef& error) { equal = error->isEqual(_error.get()); });
  return equal;
}

std::uint64_t Result::hash() const { return _isSuccess ? _value->hash() ^ kHashMultiplier : _error->hash(); }

std::string Result::description() const {
  const std::string content = " " + (_isSuccess ? _value->description() : _error->description()) + ">";
  std::string text;
  for (const char c : Object::description()) {
    if (c == '>')
      text += content;
    else
      text += c;
  }
  return text;
}

}  // namespace nimbo
