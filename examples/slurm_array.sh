#!/usr/bin/env bash
#SBATCH --job-name=morvik
#SBATCH --array=0-9
#SBATCH --cpus-per-task=4
#SBATCH --time=04:00:00
#SBATCH --output=task_%a.log
#SBATCH --open-mode=append
#
# Divides a simulation among the tasks of a Slurm job array: each simulates the next BLOCKS blocks of every point.
# Arguments are those of `morvik ber`. In an empty folder for the results:
#
#   export MORVIK=$HOME/morvik/build/x86_64/bin/morvik BLOCKS=5000000
#   job=$(sbatch --parsable --array=0-31 slurm_array.sh --block-size 512 --ebn0 1.6:0.2:2.2)
#   sbatch --dependency=afterok:$job --wrap='$MORVIK merge task_*.csv --output k512.csv'
#
# When the time was up, or a machine has failed, submit the same array again: tasks that have not ended go on, the others
# have nothing to do. For more blocks later, submit the tasks from 32 on.
set -euo pipefail
morvik=${MORVIK:-morvik}
blocks=${BLOCKS:-1000000}
task=${SLURM_ARRAY_TASK_ID:?is set by Slurm in the tasks of a job array, or by hand}
[ $# -gt 0 ] || set -- --block-size 512 --ebn0 1:0.2:2

exec "$morvik" ber "$@" --frames "$((task * blocks)):$(((task + 1) * blocks))" \
    --threads "${SLURM_CPUS_PER_TASK:-1}" --output "task_$task.csv" --resume
