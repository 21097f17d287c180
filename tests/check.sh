# For test scripts: counts checks and shows what a failed one printed.
passed=0
failed=0

# check WHAT COMMAND [ARG...]: the command must succeed.
check() {
    local what=$1 output
    shift
    if output=$("$@" 2>&1); then
        passed=$((passed + 1))
    else
        failed=$((failed + 1))
        printf 'FAILED: %s\n%s\n' "$what" "$output"
    fi
}

# The closing line, and the script's exit status.
finish() {
    printf '%d passed, %d failed\n' "$passed" "$failed"
    [ "$failed" -eq 0 ]
    exit
}
