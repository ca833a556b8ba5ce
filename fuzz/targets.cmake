# SPDX-License-Identifier: Apache-2.0
# One line per target.
probeview_fuzz(messages KNOWS messages values)
probeview_fuzz(configuration KNOWS configuration)
probeview_fuzz(trace KNOWS trace_source)
probeview_fuzz(batch KNOWS tools)
probeview_fuzz(store KNOWS store client radix platform values)
probeview_fuzz(replies KNOWS tools)
probeview_fuzz(frames KNOWS service radix platform values)
