// SPDX-License-Identifier: Apache-2.0

// An empty library.
