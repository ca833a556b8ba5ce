# SPDX-License-Identifier: Apache-2.0
"""A second opinion on what payloads mean, what the store keeps and what the pages show.

Written apart from the programs and as differently as possible from them: plain text tables, exceptions, slices of bytes
and functions put together from steps, in Python's standard library alone. Speed and accessors are of no interest here.
"""
