# SPDX-License-Identifier: Apache-2.0
#
# Makes the comments of a header visible for Doxygen: those before an item ("//" to "///") and those after it ("///<").

/^\/\/ SPDX/d
/^ *\/\/ *----/b
s|^( *)// ?|\1/// |
t text
s|([;,{}].*[^:/])// |\1///< |
t text
b
:text
s/<([a-zA-Z]+>)/\\<\1/g
