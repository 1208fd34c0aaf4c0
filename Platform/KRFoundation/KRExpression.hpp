#pragma once

#include <cstddef>
#include <functional>
#include <memory>
#include <string>
#include <vector>

#include "KRFoundation/KRObject.hpp"
#include "KRFoundation/KRValue.hpp"

// An expression of the platform's expression format, evaluated on an object: the operands of predicates
// and the formulas of computed conditions. Immutable after construction, so one expression may be
// evaluated from several threads at once.
//
// Format syntax (expressionWithFormat):
// - numbers (12, 1.5, 2e3), strings ('x', "x"), YES/NO/TRUE/FALSE, NIL/NULL, CAST(seconds, "NSDate")
//   (seconds since 2001-01-01 UTC, as the platform writes dates), array literals {a, b};
// - key paths (a.b.c, "#key" for a key spelled like a keyword, "#'any key'" for a key that is not a
//   word, such as "#'first name'" or "#''"), SELF and SELF.a.b, variables $name;
// - arithmetic: + - * / and ** (power, right-associative, binding tighter than a unary minus on its
//   left: -2 ** 2 is -4), unary minus, parentheses;
// - FUNCTION(receiver, 'name'): calls the function registered under the name with the receiver's value;
// - format arguments: %@ (a value), %K (a key path given as a string), %d %i %u %ld... and %f %g %e
//   (the next argument as an integer or a double).
// A format that does not parse raises NSInvalidArgumentException with the position of the failure.
//
// Evaluation:
// - key paths go through KRValue::valueForKeyPath; a key that the object does not know raises its
//   unknown-key KRException (NSUnknownKeyException), which propagates to the caller;
// - arithmetic follows KRNumberArithmetic; an operand that is not a number makes the result nil;
// - an unregistered function name or a variable missing from the context raises
//   NSInvalidArgumentException.
class KRExpression : public KRObject {
 public:
  enum class Type { ConstantValue, EvaluatedObject, Variable, KeyPath, Function, Arithmetic, Aggregate };
  enum class ArithmeticOperator { Add, Subtract, Multiply, Divide, Power, Negate };
  using Function = std::function<KRValue(const KRValue& receiver)>;

  // Deepest expression tree accepted, so that evaluating and formatting never exhaust the stack.
  static constexpr size_t kMaximumHeight = 256;
  // Seconds from 1970-01-01 to 2001-01-01 UTC, the reference date of CAST(seconds, "NSDate").
  static constexpr double kReferenceDateOffset = 978307200.0;

  static std::shared_ptr<KRExpression> expressionWithFormat(const std::string& format,
                                                            std::vector<KRValue> arguments = {});
  static std::shared_ptr<KRExpression> expressionForConstantValue(KRValue value);
  static std::shared_ptr<KRExpression> expressionForEvaluatedObject();
  static std::shared_ptr<KRExpression> expressionForVariable(std::string name);
  // "SELF" is the evaluated object and a leading "SELF." is dropped.
  static std::shared_ptr<KRExpression> expressionForKeyPath(std::string keyPath);
  // The composite factories raise NSInvalidArgumentException beyond kMaximumHeight, and when given an
  // empty expression or the wrong number of operands (one for Negate, two otherwise).
  static std::shared_ptr<KRExpression> expressionForFunction(std::shared_ptr<KRExpression> receiver,
                                                             std::string name);
  static std::shared_ptr<KRExpression> expressionForArithmetic(
      ArithmeticOperator op, std::vector<std::shared_ptr<KRExpression>> operands);
  static std::shared_ptr<KRExpression> expressionForAggregate(
      std::vector<std::shared_ptr<KRExpression>> elements);

  // Registers (or, with an empty function, removes) a function for FUNCTION(receiver, 'name'). The
  // registry is process-wide and may be used from any thread.
  static void registerFunction(const std::string& name, Function function);

  Type expressionType() const { return type_; }
  // The constant of a ConstantValue expression; nil otherwise.
  const KRValue& constantValue() const { return constant_; }
  // The key path, variable name or function name; empty for other types.
  const std::string& keyPath() const { return name_; }
  const std::string& variable() const { return name_; }
  const std::string& function() const { return name_; }
  ArithmeticOperator arithmeticOperator() const { return operator_; }
  // The function's receiver, the arithmetic operands or the aggregate's elements.
  const std::vector<std::shared_ptr<KRExpression>>& arguments() const { return arguments_; }
  // Number of levels of the tree: 1 for a leaf.
  size_t height() const { return height_; }

  KRValue expressionValueWithObject(const KRValue& object, const KRDictionary& context = {}) const;
  // A format that parses back to an equal expression. Keys that are not plain names are escaped, so
  // every key path reads back, the empty one included (%K refuses an empty key path, but a key path
  // made here may be empty or hold empty keys). Exceptions: constants without a literal form
  // (dictionaries, objects, NaN) are written as their description, strings and keys that are not valid
  // UTF-8 keep their bytes, and sets are written as array literals (parsing back to arrays).
  std::string expressionFormat() const;
  std::string description() const override { return expressionFormat(); }
  bool isEqual(const std::shared_ptr<const KRObject>& other) const override;
  uint64_t hash() const override;

 private:
  explicit KRExpression(Type type) : type_(type) {}
  static std::shared_ptr<KRExpression> composite(Type type,
                                                 std::vector<std::shared_ptr<KRExpression>> arguments);

  KRValue variableValue(const KRDictionary& context) const;
  KRValue functionValue(const KRValue& object, const KRDictionary& context) const;
  KRValue arithmeticValue(const KRValue& object, const KRDictionary& context) const;
  KRValue aggregateValue(const KRValue& object, const KRDictionary& context) const;
  std::string arithmeticFormat() const;
  std::string aggregateFormat() const;
  // Binding strength in a format, from 1 (+ -) to 5 (operands that never need parentheses).
  int precedence() const;
  std::string operandFormat(size_t index, int minimumPrecedence) const;

  Type type_;
  KRValue constant_;
  std::string name_;
  ArithmeticOperator operator_ = ArithmeticOperator::Add;
  std::vector<std::shared_ptr<KRExpression>> arguments_;
  size_t height_ = 1;
};
