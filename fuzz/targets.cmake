# SPDX-License-Identifier: Apache-2.0
# One line per target.
