# What two verifications of the same installation share wherever the installation and the
# verifier are: the counts and, for each result in order, all but the detail texts (they name
# the installation's paths and the verifier's folder). Input: the JSON output of
# `vantori-verify --format json`; used by the jobs that compare runs (jq -f findings.jq).
{
    checksPerformed, errors, warnings, cancelled,
    results: [.results[] | {severity, messageNumber, helpContextId, summary, ignored,
                            details: (.details | length)}]
}
