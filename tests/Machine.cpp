#include "Machine.h"

Function::Values Function::Draw() const {
  Values values(parameters.size());
  for (size_t k = 0; k < parameters.size(); ++k) {
    const Type& type = *parameters[k].type;
    for (size_t i = 0; i < parameters[k].targets; ++i) type.draw(values[k].bytes + i * type.size);
    if (static_cast<int>(k) == options.count) {
      const int32_t count = *rc::gen::inRange(-1, 8);
      std::memcpy(values[k].bytes, &count, sizeof count);
    }
    // Equal operands are too rare by chance.
    if (k > 0 && &type == parameters[k - 1].type && *rc::gen::inRange(0, 8) == 0)
      values[k] = values[k - 1];
  }
  return values;
}

Function::Places Function::OwnPlaces(Values& values) {
  Places places;
  for (Room& room : values) places.push_back(room.bytes);
  return places;
}

std::string Function::Outcome(const Places& places, size_t without) const {
  std::string outcome;
  host.Take();
  try {
    outcome = call(places.data());
  } catch (int code) {
    outcome = "throws " + std::to_string(code);
  }
  for (size_t k = 0; k < parameters.size(); ++k) {
    if (!parameters[k].isOutput || !places[k] || k == without) continue;
    const Type& type = *parameters[k].type;
    for (size_t i = 0; i < parameters[k].targets; ++i) {
      outcome += type.bits(static_cast<char*>(places[k]) + i * type.size);
    }
  }
  for (const std::string& each : host.Take()) outcome += each;
  return outcome;
}

std::string Function::Text(const Values& values) const {
  std::ostringstream text;
  text << name << '(';
  for (size_t k = 0; k < parameters.size(); ++k) {
    text << (k > 0 ? ", " : "") << (parameters[k].isPointer ? "&" : "");
    const Type& type = *parameters[k].type;
    for (size_t i = 0; i < parameters[k].targets; ++i)
      type.show(values[k].bytes + i * type.size, text);
  }
  text << ')';
  return text.str();
}
