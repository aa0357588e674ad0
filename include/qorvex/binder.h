// Native types and values on their way to and from script.
//
// A Binder is a stack machine over script values: writing pushes values and folds them into arrays and
// objects, reading pops values and checks their types. The same client function that names a type's
// properties serves three modes: bind (native to script), read (script to native) and register. All
// operations run on the main thread; the engine implements Binder and ArgumentsBinder, the client
// IEventHandler and Property.
#pragma once

#include <qorvex/export.h>

#include <cstddef>
#include <cstdint>

namespace qorvex {

class ArgumentsBinder;
class Binder;

// One bound field of a native type.
class Property {
  public:
    Property(const char* name, bool byRef) : Name(name), ByRef(byRef) {}
    virtual ~Property() = default;
    virtual void* Bind(Binder* binder, void* object) = 0;      // writes the field's value
    virtual void* GetByRef(Binder* binder, void* object) = 0;  // pushes the field for a by-reference getter
    virtual void* Read(Binder* binder, void* object) = 0;      // reads the top script value into the field
    virtual void* SetByRef(Binder* binder, void* object) = 0;  // sets the field from the top script value
    virtual Property* Clone() const = 0;
    // Data binding. False or null: the field is not of that kind.
    virtual bool ToBool(void* object, bool* out) = 0;
    virtual bool ToNumber(void* object, double* out) = 0;
    virtual bool ToString(void* object, char* buffer, std::size_t* length) = 0;
    virtual bool ToColor(void* object, void* out) = 0;
    virtual bool ToMatrix(void* object, void* out) = 0;
    virtual bool GetArrayInfo(Binder* binder, void* object, void* out) = 0;
    virtual bool GetPairInfo(Binder* binder, void* object, void* out) = 0;
    virtual bool GetMapInfo(Binder* binder, void* object, void* out) = 0;
    virtual bool GetUserType(Binder* binder, void* object, void* out) = 0;

    const char* Name;
    bool ByRef;
};

// A native callable. The engine owns handlers from their registration on.
class IEventHandler {
  public:
    virtual ~IEventHandler() = default;
    virtual void Invoke(ArgumentsBinder* arguments) = 0;
    // The object whose member the handler is; null for free functions.
    virtual void* GetTarget() const = 0;
    virtual void SetTarget(void* object) = 0;
};

// What a client holds of a type while it registers it: opaque state of the binder and the object.
struct TypeDescription {
    void* State = nullptr;
    const void* Object = nullptr;
};

enum class ScriptValueType : std::uint32_t { Null = 0, Boolean, Number, String, Object, Array };

class Binder {
  public:
    using ArrayProxyGetter = void (*)(Binder* binder, void* address, unsigned index);
    using ArrayProxySetter = void (*)(Binder* binder, void* address, unsigned index);

    virtual ~Binder() = default;

    virtual TypeDescription RegisterType(const char* name, const void* object) = 0;
    virtual TypeDescription RegisterType(const char* name, void* object) = 0;
    virtual void AddProperty(void* object, Property& property) = 0;  // keeps a clone
    virtual void AddMethod(const char* name, IEventHandler* handler) = 0;
    virtual void BeginBind() = 0;
    virtual bool CheckType(const char* name) = 0;
    virtual void BeginRead() = 0;
    virtual void* GetLastType() = 0;
    virtual void EndType(void* object) = 0;

    virtual void EventBegin(const char* name) = 0;
    virtual void EventEnd() = 0;
    virtual void BeginGlobal() = 0;
    virtual void EndGlobal(const char* name) = 0;
    virtual void SetExposeMode(unsigned mode) = 0;  // 0 plain, 1 by reference, 2 registering
    virtual unsigned GetExposeMode() const = 0;
    virtual bool BindByRef(void* record, void* object) = 0;

    virtual void TypeBegin(const char* name) = 0;
    virtual void PropertyName(const char* name) = 0;
    virtual void BindNull() = 0;
    virtual void BindString(const char32_t* text, std::size_t length) = 0;
    virtual void BindString(const char16_t* text, std::size_t length) = 0;
    virtual void BindString(const wchar_t* text, std::size_t length) = 0;
    virtual void BindString(const char* utf8, std::size_t length) = 0;
    virtual void BindNumber(double value) = 0;
    virtual void BindNumber(float value) = 0;
    virtual void BindNumber(unsigned char value) = 0;
    virtual void BindNumber(signed char value) = 0;
    virtual void BindNumber(unsigned long value) = 0;
    virtual void BindNumber(long value) = 0;
    virtual void BindNumber(unsigned long long value) = 0;
    virtual void BindNumber(long long value) = 0;
    virtual void BindNumber(unsigned int value) = 0;
    virtual void BindNumber(int value) = 0;
    virtual void BindNumber(unsigned short value) = 0;
    virtual void BindNumber(short value) = 0;
    virtual void BindBool(bool value) = 0;
    virtual void BindIntArray(const int* values, std::size_t count) = 0;
    virtual void BindFloatArray(const float* values, std::size_t count) = 0;
    virtual bool BindArrayProxy(void* address, std::size_t size, ArrayProxyGetter getter,
                                ArrayProxySetter setter) = 0;
    virtual void ArrayBegin(std::size_t size) = 0;
    virtual void ArrayEnd() = 0;
    virtual void MapBegin(std::size_t size) = 0;
    virtual void MapEnd() = 0;
    virtual void ObjectBegin() = 0;
    virtual void ObjectEnd() = 0;

    virtual void ReadDrop() = 0;
    virtual bool ReadNull() = 0;
    // The text is valid until the next read of the same width.
    virtual bool ReadString(const char32_t** text, std::size_t* length) = 0;
    virtual bool ReadString(const char16_t** text, std::size_t* length) = 0;
    virtual bool ReadString(const char** utf8, std::size_t* length) = 0;
    virtual bool ReadNumber(double* value) = 0;
    virtual bool ReadNumber(float* value) = 0;
    virtual bool ReadNumber(unsigned char* value) = 0;
    virtual bool ReadNumber(signed char* value) = 0;
    virtual bool ReadNumber(unsigned short* value) = 0;
    virtual bool ReadNumber(short* value) = 0;
    virtual bool ReadNumber(unsigned int* value) = 0;
    virtual bool ReadNumber(int* value) = 0;
    virtual bool ReadNumber(unsigned long long* value) = 0;
    virtual bool ReadNumber(long long* value) = 0;
    virtual bool ReadBool(bool* value) = 0;
    virtual bool ReadProperty(const char* name) = 0;
    virtual std::size_t ReadArraySize() = 0;
    virtual void ReadArrayElement(std::size_t index) = 0;
    virtual std::size_t ReadMapBegin() = 0;
    virtual void ReadMapNext() = 0;
    virtual void ReadMapEnd() = 0;
    virtual ScriptValueType PeekValueType() = 0;
};

// The interface that a native handler sees.
class ArgumentsBinder {
  public:
    virtual ~ArgumentsBinder() = default;
    virtual Binder* SetArgument(unsigned index) = 0;
    virtual Binder* ResultBegin() = 0;  // null when nobody waits for the result
    virtual void ResultEnd() = 0;
    virtual void VoidResult() = 0;
    virtual unsigned ArgumentsCount() = 0;
    virtual bool HasErrors() = 0;
};

}  // namespace qorvex
