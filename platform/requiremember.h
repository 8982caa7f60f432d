// SPDX-FileCopyrightText: 2026 the marlo-settings-system developers
// SPDX-License-Identifier: BSD-3-Clause

#ifndef REQUIREMEMBER_H
#define REQUIREMEMBER_H

#include <type_traits>

template<typename Class, typename Use> constexpr bool compiles(Use)
{
    return std::is_invocable_v<Use, Class &>;
}

// The type of "object" below.
template<typename Reference> using Of = std::remove_reference_t<Reference>;

// Fails to compile, with a message that names the member, if the expression does not compile, in which
// "object" is of the class. cmake/DeviceLibrary.cmake shows the messages.
#define REQUIRE_MEMBER(Class, member, expression)                                                  \
    static_assert(                                                                                 \
        compiles<Class>([](auto &object) -> decltype(void(object), void(expression)) {}),          \
        #Class " lacks " member)

#endif
