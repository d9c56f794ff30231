#include "propertyText.h"

#include <charconv>
#include <orv/devMDProperty.h>

#include "mediaDevice.h"
#include "mediaError.h"

namespace MediaHost::PropertyText {

namespace {

template <class T>
constexpr const char* NAME = "";
template <>
constexpr const char* NAME<signed char> = "int8";
template <>
constexpr const char* NAME<unsigned char> = "uint8";
template <>
constexpr const char* NAME<short> = "int16";
template <>
constexpr const char* NAME<unsigned short> = "uint16";
template <>
constexpr const char* NAME<int> = "int32";
template <>
constexpr const char* NAME<unsigned> = "uint32";
template <>
constexpr const char* NAME<std::int64_t> = "int64";
template <>
constexpr const char* NAME<std::uint64_t> = "uint64";
template <>
constexpr const char* NAME<float> = "float";
template <>
constexpr const char* NAME<double> = "double";
template <>
constexpr const char* NAME<bool> = "bool";

template <class T, class Work>
bool tryType(const Property& property, Work& work) {
    if (auto scalar = Orv::RCShdPtr<Orv::DevMDProperty<T>>::dynamicCast(property);
        !scalar.isNull()) {
        work.template apply<T>(*scalar);
        return true;
    }
    using Items = Orv::Vector<T>;
    if (auto items = Orv::RCShdPtr<Orv::DevMDProperty<Items>>::dynamicCast(property);
        !items.isNull()) {
        work.template apply<Items>(*items);
        return true;
    }
    return false;
}

template <class... Types, class Work>
void visitTypes(const Property& property, Work& work) {
    if (!(tryType<Types>(property, work) || ...)) {
        throw MediaError("the property is of a type that is unknown here");
    }
}

template <class Work>
void visit(const Property& property, Work& work) {
    visitTypes<double, std::int64_t, bool, int, float, signed char, unsigned char, short,
               unsigned short, unsigned, std::uint64_t>(property, work);
}

template <class T>
constexpr bool IS_TEXT = std::is_same_v<T, TextValue>;

struct Namer {
    std::string name;
    template <class T>
    void apply(Orv::DevMDProperty<T>&) {
        if constexpr (IS_TEXT<T>) {
            name = "text";
        } else {
            name = NAME<typename Orv::DevMDValueTraits<T>::Item>;
            if (Orv::DevMDValueTraits<T>::IS_VECTOR) name += "[]";
        }
    }
};

struct Getter {
    double seconds;
    std::string text;
    template <class T>
    void apply(Orv::DevMDProperty<T>& property) {
        T value{};
        property.get(value, seconds);
        if constexpr (IS_TEXT<T>) {
            text = toText(value);
        } else {
            text = Orv::devMDToText(value).getChars();
        }
    }
};

template <class T>
T parse(const std::string& text) {
    if constexpr (std::is_same_v<T, bool>) {
        if (text == "true" || text == "1" || text == "on") return true;
        if (text == "false" || text == "0" || text == "off") return false;
        throw MediaError('"' + text + "\" is neither true nor false");
    } else {
        T value{};
        const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), value);
        if (error != std::errc() || end != text.data() + text.size()) {
            throw MediaError('"' + text + "\" is no value of the type " + NAME<T>);
        }
        return value;
    }
}

struct Setter {
    const std::string& text;
    double seconds;
    template <class T>
    void apply(Orv::DevMDProperty<T>& property) {
        if constexpr (IS_TEXT<T>) {
            property.setAndWait(toTextValue(text), seconds);
        } else if constexpr (Orv::DevMDValueTraits<T>::IS_VECTOR) {
            throw MediaError("a list of values cannot be set as text");
        } else {
            property.setAndWait(parse<T>(text), seconds);
        }
    }
};

}  // namespace

std::string getTypeName(const Property& property) {
    Namer namer;
    visit(property, namer);
    return namer.name;
}

std::string get(const Property& property, double seconds) {
    Getter getter{seconds, {}};
    visit(property, getter);
    return getter.text;
}

void set(const Property& property, const std::string& value, double seconds) {
    Setter setter{value, seconds};
    visit(property, setter);
}

}  // namespace MediaHost::PropertyText
